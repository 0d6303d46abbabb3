// LS_CAliasIndex: one location service's answer to "which identity is
// responsible for this user", found without asking every identity: the
// first identity, in the order the service lists its identities (configured
// ones, then dynamic ones, each in insertion order), of type Identity whose
// own name equals the user, or whose aliases in effect (own, else
// inherited) name it, range over it or match it. Looking a user up by table
// name and the "DEFAULT" fallback stay with the lookups.
//
// What is kept: per member identity its rank in that order, its own name and
// the alias record it shows. Identities that show the same record (an
// identity and every member that inherits its aliases unchanged) share one
// entry, so a group's names, ranges and expressions are held and matched
// once for all its members. Alias names and own names are hashed. Ranges and
// expressions are filed under a text that every user they hold begins with:
// for a range the prefix its two ends share, for an expression its leading
// literal text (possibly empty). A lookup lists the user's prefixes of the
// lengths that occur, finds the ranges over it in each bucket through a
// tree ordered by lower end that knows the highest upper end below each
// node, and matches only the expressions filed under one of those prefixes
// whose entry could still beat the best answer so far, best first. So a
// lookup costs a few hash probes whatever the number of identities, plus
// one match per expression without literal text among the entries that
// could win.
//
// Keeping up: a member tells the index whenever its name, its type or the
// alias record it shows may have changed (the record being edited, replaced
// or dropped anywhere up its base chain reaches the member as a change of
// its "alias" child). Decision: the index only notes the member then, and
// the next lookup reads the noted members again. A configuration change thus
// costs one hash probe per member it reaches, and a group edit that reaches
// thousands of members is read once, not once per notification; the price
// is that the first lookup after loading a large configuration reads it all.
// An entry is keyed by the record's address and never reads a record
// through that key: the record is read only through a member that shows it
// at that moment, and every member that showed a record that since changed
// or went away has been noted. An entry therefore is rebuilt from the live
// record, at most once per lookup, whenever a noted member shows it.
//
// Ownership: the location service owns the index and lists its identities
// in it while its tables hold them; members are borrowed, and each member
// holds the index as a borrowed pointer that the index clears when the
// member leaves or the index dies. Nothing here is announced to anyone and
// nothing is logged: the index is invisible except through its answers.
// Threading: none; the service's callers serialise lookups and changes.
#pragma once

#include <array>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "LS_Alias.h"
#include "String.h"

class LS_CIdentity;

class LS_CAliasIndex {
 public:
  LS_CAliasIndex();
  // Detaches every member.
  ~LS_CAliasIndex();
  LS_CAliasIndex(LS_CAliasIndex const&) = delete;
  LS_CAliasIndex& operator=(LS_CAliasIndex const&) = delete;

  // A configured identity appended to the service's configured table, or a
  // dynamic one to its dynamic table. An identity already listed is left as
  // it is.
  void addConfigured(LS_CIdentity* identity);
  void addDynamic(LS_CIdentity* identity);
  // A dynamic identity taken over as configured: it now comes after every
  // configured identity and before every dynamic one.
  void moveToConfigured(LS_CIdentity* identity);
  // Unknown identities are ignored.
  void remove(LS_CIdentity* identity);

  // The member's name, type or aliases in effect may have changed. Cheap:
  // the member is only noted; unknown identities are ignored.
  void identityChanged(LS_CIdentity* identity);

  // The first member of type Identity responsible for user; null when none.
  LS_CIdentity* firstResponsible(String const& user);

 private:
  // Configured members rank below dynamic ones; within each, by insertion.
  using Rank = unsigned long long;
  struct Member;
  struct Record;
  struct RangeNode;
  class RangeTree;
  struct RangeBucket;
  struct PatternKey {
    std::string prefix;  // every user the pattern matches begins with it
    RefPtr<RegEx::Pattern> pattern;
  };
  struct PatternRef {
    Record* record;
    RegEx::Pattern* pattern;
  };
  struct Answer {
    Rank rank;
    LS_CIdentity* identity;
  };
  // Which prefixes of a user are worth looking up: counts the filed
  // prefixes by length and last byte, so that a lookup probes only lengths
  // that occur and, of those, only where the user's byte at that position
  // ends some filed prefix. Most probes of a large table miss the cache;
  // this keeps them to about one per filed text the user could fall under.
  class PrefixFilter {
   public:
    void add(std::string_view prefix);
    void remove(std::string_view prefix);
    // Calls visit(prefix) for each prefix of user that passes, shortest first.
    template <class Visit>
    void forEachPrefixOf(std::string_view user, Visit const& visit) const {
      for (auto const& length : m_lengths) {
        if (length.first > user.size())
          return;
        std::string_view const prefix = user.substr(0, length.first);
        if (length.second[lastByte(prefix)] != 0)
          visit(prefix);
      }
    }

   private:
    // The empty prefix counts under 0.
    static unsigned char lastByte(std::string_view prefix) {
      return prefix.empty() ? 0 : static_cast<unsigned char>(prefix.back());
    }

    std::map<size_t, std::array<size_t, 256>> m_lengths;
  };

  void add(LS_CIdentity* identity, Rank rank);
  void refreshNoted();
  // Drops entries of m_noted that name no noted member, and repeats.
  void forgetDeparted();
  void refresh(Member& member);
  void attach(Member& member, LS_Alias const* alias, bool candidate, std::string const& name);
  void detach(Member& member);
  Record& recordFor(LS_Alias const* alias);
  void build(Record& record, LS_Alias const& alias);
  void dropKeys(Record& record);
  // answer becomes candidate's first member when that ranks lower.
  static void improve(Answer& answer, Record const& record);
  void matchPatterns(std::string_view user, String const& text, Answer& answer);

  Rank m_nextRank = 0;
  // Lookups so far that read noted members again; an entry built during
  // the current one is up to date.
  unsigned long long m_pass = 0;
  std::unordered_map<LS_CIdentity*, Member> m_members;
  // Noted members; may repeat or name identities that have left since.
  std::vector<LS_CIdentity*> m_noted;
  std::unordered_map<LS_Alias const*, std::unique_ptr<Record>> m_records;
  // Keys view strings that the members and records hold.
  std::unordered_multimap<std::string_view, Member*> m_ownNames;
  std::unordered_multimap<std::string_view, Record*> m_aliasNames;
  std::unordered_multimap<std::string_view, PatternRef> m_patterns;
  // Ranges by the prefix their two ends share.
  std::unordered_map<std::string_view, std::unique_ptr<RangeBucket>> m_ranges;
  PrefixFilter m_patternPrefixes;  // one count per filed pattern
  PrefixFilter m_rangePrefixes;    // one count per range bucket
};

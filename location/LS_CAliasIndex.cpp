#include "LS_CAliasIndex.h"

#include <algorithm>
#include <functional>

#include "LS_CIdentity.h"
#include "LockedPtr.h"

namespace {

constexpr unsigned long long DYNAMIC_RANK = 1ull << 63;

// The text that every user matched by expression begins with. Conservative:
// only characters that stand for themselves in any common expression syntax
// are taken, up to the first one that does not or that a quantifier
// follows, after one leading "^" (matching starts at the user's first byte
// anyway). An expression with "|" anywhere may match without the prefix and
// gets none; so does one that starts with a group, a class, an escape or an
// option such as "(?i)". An empty prefix only means the expression is
// matched against every user.
std::string literalPrefix(String const& expression) {
  std::string const& text = expression.str();
  if (text.find('|') != std::string::npos)
    return std::string();
  size_t const start = !text.empty() && text[0] == '^' ? 1 : 0;
  size_t end = start;
  while (end < text.size()) {
    unsigned char const c = static_cast<unsigned char>(text[end]);
    bool const plain = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') ||
                       std::string_view("-_@#!%&,;:=~'\"/<> ").find(static_cast<char>(c)) != std::string_view::npos;
    if (!plain)
      break;
    ++end;
  }
  if (end < text.size() && std::string_view("?*+{").find(text[end]) != std::string_view::npos && end > start)
    --end;
  return text.substr(start, end - start);
}

// The text that every user between from and to begins with: strings that
// begin with one text form one stretch of the byte order, so a user between
// two of them begins with it too.
std::string_view commonPrefix(std::string_view from, std::string_view to) {
  size_t length = 0;
  while (length < from.size() && length < to.size() && from[length] == to[length])
    ++length;
  return from.substr(0, length);
}


template <class Map, class Value>
void eraseEntry(Map& map, std::string_view key, Value const& value) {
  auto const range = map.equal_range(key);
  for (auto entry = range.first; entry != range.second; ++entry) {
    if (entry->second == value) {
      map.erase(entry);
      return;
    }
  }
}

}  // namespace

struct LS_CAliasIndex::Member {
  LS_CIdentity* identity = nullptr;
  Rank rank = 0;
  Record* record = nullptr;  // the entry of the record shown; null for none
  std::string name;          // own name, as last read
  bool candidate = false;    // of type Identity, as last read
  bool noted = false;
};

struct LS_CAliasIndex::Record {
  LS_Alias const* source = nullptr;  // the key; read only through a member
  size_t members = 0;
  // Members of type Identity that show the record, by rank.
  std::map<Rank, LS_CIdentity*> candidates;
  std::vector<std::string> names;
  std::vector<RangeNode*> ranges;
  std::vector<PatternKey> patterns;
  unsigned long long builtIn = 0;  // the pass that last built the keys
};

struct LS_CAliasIndex::RangeNode {
  std::string from;
  std::string to;
  Record* record = nullptr;
  unsigned int priority = 0;
  RangeNode* left = nullptr;
  RangeNode* right = nullptr;
  std::string const* highest = nullptr;  // the greatest "to" in this subtree
};

// A treap ordered by lower end (ties by node address), each node knowing the
// highest upper end in its subtree, so that the ranges over one user are
// found without visiting those that end below it or start above it. Owns
// its nodes.
class LS_CAliasIndex::RangeTree {
 public:
  RangeTree() = default;
  ~RangeTree() { destroy(m_root); }
  RangeTree(RangeTree const&) = delete;
  RangeTree& operator=(RangeTree const&) = delete;

  bool isEmpty() const { return !m_root; }

  RangeNode* insert(std::string const& from, std::string const& to, Record* record) {
    auto* const node = new RangeNode;
    node->from = from;
    node->to = to;
    node->record = record;
    node->priority = nextPriority();
    node->highest = &node->to;
    RangeNode* lower = nullptr;
    RangeNode* higher = nullptr;
    split(m_root, node, lower, higher);
    m_root = merge(merge(lower, node), higher);
    return node;
  }

  void erase(RangeNode* node) {
    erase(m_root, node);
    delete node;
  }

  // Calls visit(record) for every range from <= user <= to.
  template <class Visit>
  void stab(std::string_view user, Visit const& visit) const {
    stab(m_root, user, visit);
  }

 private:
  static bool before(RangeNode const* a, RangeNode const* b) {
    int const order = a->from.compare(b->from);
    if (order != 0)
      return order < 0;
    return std::less<RangeNode const*>()(a, b);
  }

  static void update(RangeNode* node) {
    node->highest = &node->to;
    for (RangeNode const* child : {node->left, node->right}) {
      if (child && node->highest->compare(*child->highest) < 0)
        node->highest = child->highest;
    }
  }

  // lower takes the nodes before key, higher the rest.
  static void split(RangeNode* tree, RangeNode const* key, RangeNode*& lower, RangeNode*& higher) {
    if (!tree) {
      lower = higher = nullptr;
      return;
    }
    if (before(tree, key)) {
      split(tree->right, key, tree->right, higher);
      lower = tree;
    } else {
      split(tree->left, key, lower, tree->left);
      higher = tree;
    }
    update(tree);
  }

  static RangeNode* merge(RangeNode* lower, RangeNode* higher) {
    if (!lower)
      return higher;
    if (!higher)
      return lower;
    if (lower->priority > higher->priority) {
      lower->right = merge(lower->right, higher);
      update(lower);
      return lower;
    }
    higher->left = merge(lower, higher->left);
    update(higher);
    return higher;
  }

  static void erase(RangeNode*& tree, RangeNode const* node) {
    if (!tree)
      return;
    if (tree == node) {
      tree = merge(tree->left, tree->right);
      return;
    }
    erase(before(node, tree) ? tree->left : tree->right, node);
    update(tree);
  }

  template <class Visit>
  static void stab(RangeNode const* tree, std::string_view user, Visit const& visit) {
    while (tree && tree->highest->compare(user) >= 0) {
      stab(tree->left, user, visit);
      if (tree->from.compare(user) > 0)
        return;
      if (tree->to.compare(user) >= 0)
        visit(*tree->record);
      tree = tree->right;
    }
  }

  static void destroy(RangeNode* tree) {
    while (tree) {
      destroy(tree->left);
      RangeNode* const right = tree->right;
      delete tree;
      tree = right;
    }
  }

  // Fixed xorshift sequence: the shape, and so the cost, repeats run to run.
  unsigned int nextPriority() {
    m_state ^= m_state << 13;
    m_state ^= m_state >> 17;
    m_state ^= m_state << 5;
    return m_state;
  }

  RangeNode* m_root = nullptr;
  unsigned int m_state = 2463534242u;
};

void LS_CAliasIndex::PrefixFilter::add(std::string_view prefix) {
  ++m_lengths[prefix.size()][lastByte(prefix)];
}

void LS_CAliasIndex::PrefixFilter::remove(std::string_view prefix) {
  auto const length = m_lengths.find(prefix.size());
  --length->second[lastByte(prefix)];
  for (size_t const count : length->second) {
    if (count != 0)
      return;
  }
  m_lengths.erase(length);
}

// The ranges whose ends share one prefix.
struct LS_CAliasIndex::RangeBucket {
  std::string prefix;
  RangeTree tree;
};

LS_CAliasIndex::LS_CAliasIndex() = default;

LS_CAliasIndex::~LS_CAliasIndex() {
  for (auto& entry : m_members)
    entry.first->setAliasIndex(nullptr);
}

void LS_CAliasIndex::addConfigured(LS_CIdentity* identity) {
  add(identity, m_nextRank++);
}

void LS_CAliasIndex::addDynamic(LS_CIdentity* identity) {
  add(identity, DYNAMIC_RANK | m_nextRank++);
}

void LS_CAliasIndex::add(LS_CIdentity* identity, Rank rank) {
  auto const inserted = m_members.emplace(identity, Member());
  if (!inserted.second)
    return;
  Member& member = inserted.first->second;
  member.identity = identity;
  member.rank = rank;
  identity->setAliasIndex(this);
  identityChanged(identity);
}

void LS_CAliasIndex::moveToConfigured(LS_CIdentity* identity) {
  auto const found = m_members.find(identity);
  if (found == m_members.end())
    return;
  detach(found->second);
  found->second.rank = m_nextRank++;
  identityChanged(identity);
}

void LS_CAliasIndex::remove(LS_CIdentity* identity) {
  auto const found = m_members.find(identity);
  if (found == m_members.end())
    return;
  detach(found->second);
  m_members.erase(found);
  identity->setAliasIndex(nullptr);
}

void LS_CAliasIndex::identityChanged(LS_CIdentity* identity) {
  auto const found = m_members.find(identity);
  if (found == m_members.end() || found->second.noted)
    return;
  found->second.noted = true;
  m_noted.push_back(identity);
  // Members that left while noted stay listed; without lookups that reach
  // the index (all by table name, say) they would pile up as identities
  // come and go.
  if (m_noted.size() > 2 * m_members.size() + 64)
    forgetDeparted();
}

void LS_CAliasIndex::forgetDeparted() {
  std::vector<LS_CIdentity*> kept;
  for (LS_CIdentity* const identity : m_noted) {
    auto const found = m_members.find(identity);
    if (found == m_members.end() || !found->second.noted)
      continue;
    // Cleared while kept, so that a repeated entry is kept once.
    found->second.noted = false;
    kept.push_back(identity);
  }
  for (LS_CIdentity* const identity : kept)
    m_members.find(identity)->second.noted = true;
  m_noted.swap(kept);
}

LS_CIdentity* LS_CAliasIndex::firstResponsible(String const& user) {
  refreshNoted();
  std::string_view const key(user.str());
  Answer answer{~0ull, nullptr};
  auto const own = m_ownNames.equal_range(key);
  for (auto entry = own.first; entry != own.second; ++entry) {
    if (entry->second->rank < answer.rank)
      answer = Answer{entry->second->rank, entry->second->identity};
  }
  auto const named = m_aliasNames.equal_range(key);
  for (auto entry = named.first; entry != named.second; ++entry)
    improve(answer, *entry->second);
  m_rangePrefixes.forEachPrefixOf(key, [this, key, &answer](std::string_view prefix) {
    auto const bucket = m_ranges.find(prefix);
    if (bucket != m_ranges.end())
      bucket->second->tree.stab(key, [&answer](Record const& record) { improve(answer, record); });
  });
  matchPatterns(key, user, answer);
  return answer.identity;
}

void LS_CAliasIndex::improve(Answer& answer, Record const& record) {
  if (record.candidates.empty())
    return;
  auto const first = record.candidates.begin();
  if (first->first < answer.rank)
    answer = Answer{first->first, first->second};
}

// Only patterns whose record could still beat the answer are matched, in
// rank order, so the first match is the answer and each pattern is matched
// at most once.
void LS_CAliasIndex::matchPatterns(std::string_view user, String const& text, Answer& answer) {
  std::vector<std::pair<Rank, PatternRef>> tried;
  m_patternPrefixes.forEachPrefixOf(user, [this, &tried, &answer](std::string_view prefix) {
    auto const filed = m_patterns.equal_range(prefix);
    for (auto entry = filed.first; entry != filed.second; ++entry) {
      Record const& record = *entry->second.record;
      if (!record.candidates.empty() && record.candidates.begin()->first < answer.rank)
        tried.emplace_back(record.candidates.begin()->first, entry->second);
    }
  });
  std::sort(tried.begin(), tried.end(),
            [](auto const& a, auto const& b) { return a.first < b.first; });
  for (auto const& entry : tried) {
    if (entry.second.pattern->match(text, 0).isSuccess()) {
      improve(answer, *entry.second.record);
      return;
    }
  }
}

void LS_CAliasIndex::refreshNoted() {
  if (m_noted.empty())
    return;
  ++m_pass;
  std::vector<LS_CIdentity*> noted;
  noted.swap(m_noted);
  for (LS_CIdentity* const identity : noted) {
    auto const found = m_members.find(identity);
    if (found != m_members.end() && found->second.noted)
      refresh(found->second);
  }
}

void LS_CAliasIndex::refresh(Member& member) {
  member.noted = false;
  LockedPtr<LS_CIdentity> const identity(member.identity);
  LS_Alias const* const alias = identity->aliasInEffect();
  bool const candidate = identity->getIdentityType() == LS_IdentityType::IDENTITY;
  String const name = identity->getName();
  bool const sameRecord = member.record ? member.record->source == alias : !alias;
  if (sameRecord && candidate == member.candidate && name.str() == member.name) {
    // The record may have been edited in place.
    if (member.record && member.record->builtIn != m_pass)
      build(*member.record, *alias);
    return;
  }
  detach(member);
  attach(member, alias, candidate, name.str());
}

void LS_CAliasIndex::attach(Member& member, LS_Alias const* alias, bool candidate, std::string const& name) {
  member.name = name;
  member.candidate = candidate;
  if (candidate)
    m_ownNames.emplace(std::string_view(member.name), &member);
  if (!alias)
    return;
  Record& record = recordFor(alias);
  ++record.members;
  if (candidate)
    record.candidates.emplace(member.rank, member.identity);
  member.record = &record;
}

void LS_CAliasIndex::detach(Member& member) {
  if (member.candidate)
    eraseEntry(m_ownNames, member.name, &member);
  member.candidate = false;
  Record* const record = member.record;
  member.record = nullptr;
  if (!record)
    return;
  record->candidates.erase(member.rank);
  if (--record->members > 0)
    return;
  dropKeys(*record);
  m_records.erase(record->source);
}

// The entry of alias, made or rebuilt from the record as it is now.
LS_CAliasIndex::Record& LS_CAliasIndex::recordFor(LS_Alias const* alias) {
  std::unique_ptr<Record>& entry = m_records[alias];
  if (!entry) {
    entry = std::make_unique<Record>();
    entry->source = alias;
  }
  if (entry->builtIn != m_pass)
    build(*entry, *alias);
  return *entry;
}

void LS_CAliasIndex::build(Record& record, LS_Alias const& alias) {
  dropKeys(record);
  record.builtIn = m_pass;
  for (String const& name : alias.names)
    record.names.push_back(name.str());
  for (std::string const& name : record.names)
    m_aliasNames.emplace(std::string_view(name), &record);
  for (LS_AliasRange const& range : alias.ranges) {
    // A range whose ends are the wrong way round holds no user.
    if (range.to < range.from)
      continue;
    std::string_view const prefix = commonPrefix(range.from.str(), range.to.str());
    auto bucket = m_ranges.find(prefix);
    if (bucket == m_ranges.end()) {
      auto made = std::make_unique<RangeBucket>();
      made->prefix = std::string(prefix);
      std::string_view const key = made->prefix;
      bucket = m_ranges.emplace(key, std::move(made)).first;
      m_rangePrefixes.add(key);
    }
    record.ranges.push_back(bucket->second->tree.insert(range.from.str(), range.to.str(), &record));
  }
  for (size_t index = 0; index < alias.patterns.size(); ++index) {
    if (!alias.patterns[index])
      continue;
    String const expression = index < alias.expressions.size() ? alias.expressions[index] : String();
    record.patterns.push_back(PatternKey{literalPrefix(expression), alias.patterns[index]});
  }
  for (PatternKey const& key : record.patterns) {
    m_patterns.emplace(std::string_view(key.prefix), PatternRef{&record, key.pattern.get()});
    m_patternPrefixes.add(key.prefix);
  }
}

void LS_CAliasIndex::dropKeys(Record& record) {
  for (std::string const& name : record.names)
    eraseEntry(m_aliasNames, name, &record);
  record.names.clear();
  for (RangeNode* const node : record.ranges) {
    auto const bucket = m_ranges.find(commonPrefix(node->from, node->to));
    bucket->second->tree.erase(node);
    if (!bucket->second->tree.isEmpty())
      continue;
    m_rangePrefixes.remove(bucket->first);
    m_ranges.erase(bucket);
  }
  record.ranges.clear();
  for (PatternKey const& key : record.patterns) {
    auto const filed = m_patterns.equal_range(key.prefix);
    for (auto entry = filed.first; entry != filed.second; ++entry) {
      if (entry->second.record == &record && entry->second.pattern == key.pattern.get()) {
        m_patterns.erase(entry);
        break;
      }
    }
    m_patternPrefixes.remove(key.prefix);
  }
  record.patterns.clear();
}

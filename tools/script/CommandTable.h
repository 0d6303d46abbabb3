// CommandTable: the script language of the host programs. Each command is a
// pattern of words with a handler; a line runs the first command whose pattern
// it matches in full. A pattern is written the way the reference shows it:
//
//   location-service <service> domain insert <index> <domain>
//
// Plain words are keywords. A word in angle brackets takes one value whose
// kind its name gives (a number for <index>, a host-port for <domain>, one
// of the enumeration's texts for <imperative>, and so on: see Argument
// kinds in the source). "[<x>]" may be left out at the end of a line, and
// "<x>..." takes every word up to the end, "[<x>...]" none or more.
//
// Every value is converted while the line is matched, before any handler
// runs; a handler checks that the objects it names exist before it changes
// anything, and then makes one change. So a line that fails changes nothing.
// What the commands do belongs to the command sets (ConfigCommands,
// StackCommands, SessionCommands), not here.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <string>
#include <vector>

#include "CHostPort.h"
#include "CNameAddr.h"
#include "IpAddress.h"
#include "ScriptLine.h"

class ScriptSession;

// How the language writes an enumeration's text: lower-case, with hyphens
// for blanks ("Identity-Group" is typed identity-group).
std::string enumerationWord(char const* text);

// The values of one matched line, by the names their pattern gives them.
class Arguments {
 public:
  struct Value {
    std::string text;
    size_t column = 0;
    uint32_t number = 0;
    int32_t delta = 0;
    bool on = false;
    CHostPort hostPort;
    CNameAddr nameAddr;
    IpAddress ipAddress;
  };

  bool has(char const* name) const { return m_values.count(name) != 0; }
  std::string const& text(char const* name) const { return first(name).text; }
  size_t column(char const* name) const { return first(name).column; }
  unsigned int number(char const* name) const { return first(name).number; }
  int delta(char const* name) const { return first(name).delta; }
  bool on(char const* name) const { return first(name).on; }
  // The empty host-port when the optional value was left out.
  CHostPort hostPort(char const* name) const { return has(name) ? first(name).hostPort : CHostPort(); }
  CNameAddr const& nameAddr(char const* name) const { return first(name).nameAddr; }
  IpAddress const& ipAddress(char const* name) const { return first(name).ipAddress; }
  // An enumeration value: the index of its text in the enumeration's table.
  template <class Enumeration>
  typename Enumeration::Type choice(char const* name) const {
    return static_cast<typename Enumeration::Type>(first(name).number);
  }
  // Every value of a repeated argument, in line order; empty when absent.
  std::vector<Value> const& all(char const* name) const;

  void add(std::string const& name, Value value) { m_values[name].push_back(std::move(value)); }

 private:
  Value const& first(char const* name) const { return all(name).front(); }

  std::map<std::string, std::vector<Value>> m_values;
};

class CommandTable {
 public:
  using Handler = std::function<void(ScriptSession&, Arguments const&)>;

  // pattern as described above; summary is one line for the reference.
  void add(std::string const& pattern, std::string const& summary, Handler handler);

  // Runs the command the line names. Throws CommandError, naming the word
  // where no pattern fits and what would have fitted there, or passes on the
  // handler's CommandError.
  void run(ScriptSession& session, ScriptLine const& line) const;

  // The reference: every pattern whose first word is topic (all when topic
  // is empty), with its summary, in table order.
  std::string reference(std::string const& topic) const;

 private:
  struct Token {
    std::string word;
    bool placeholder = false;
    bool optional = false;
    bool repeated = false;
  };
  struct Command {
    std::string pattern;
    std::vector<Token> tokens;
    std::string summary;
    Handler handler;
  };
  struct Mismatch;

  bool match(Command const& command, ScriptLine const& line, Arguments& arguments, Mismatch& mismatch) const;

  std::vector<Command> m_commands;
};

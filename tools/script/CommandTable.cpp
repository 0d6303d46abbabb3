#include "CommandTable.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <set>

#include "FaceNames.h"
#include "LS_AuthenticationProtocol.h"
#include "LS_FilterType.h"
#include "LS_ForcedDestination.h"
#include "LS_IdentityType.h"
#include "LS_Imperative.h"
#include "LS_KeepAliveMethod.h"
#include "LS_MwiSubscriptionMode.h"
#include "LS_NatTraversalMethod.h"
#include "LS_ProtocolConfig.h"
#include "LS_RegistrationMode.h"
#include "LS_UriScheme.h"
#include "LS_User.h"

namespace {

using Value = Arguments::Value;

// The words of an enumeration, from its texts read from NAME until it
// answers with the invalid text.
template <class Enumeration>
std::vector<std::string> textsOf() {
  using Type = typename Enumeration::Type;
  char const* const invalid = Enumeration::NAME(static_cast<Type>(UINT32_MAX));
  std::vector<std::string> texts;
  for (uint32_t value = 0; std::strcmp(Enumeration::NAME(static_cast<Type>(value)), invalid) != 0; ++value)
    texts.push_back(enumerationWord(Enumeration::NAME(static_cast<Type>(value))));
  return texts;
}

bool convertNumber(std::string const& text, Value& value) {
  if (text.empty() || text.size() > 10 || !std::all_of(text.begin(), text.end(), ::isdigit))
    return false;
  unsigned long long const number = std::stoull(text);
  value.number = static_cast<uint32_t>(number);
  return number <= UINT32_MAX;
}

bool convertDelta(std::string const& text, Value& value) {
  size_t const digits = !text.empty() && (text[0] == '+' || text[0] == '-') ? 1 : 0;
  if (text.size() == digits || text.size() - digits > 10 ||
      !std::all_of(text.begin() + digits, text.end(), ::isdigit))
    return false;
  long long const delta = std::stoll(text);
  value.delta = static_cast<int32_t>(delta);
  return delta >= INT32_MIN && delta <= INT32_MAX;
}

bool convertSwitch(std::string const& text, Value& value) {
  value.on = text == "on";
  return text == "on" || text == "off";
}

bool convertHostPort(std::string const& text, Value& value) {
  return value.hostPort.Parse(text.data(), text.size());
}

bool convertNameAddr(std::string const& text, Value& value) {
  return value.nameAddr.Parse(text.data(), text.size());
}

// "any", an address, or address/mask.
bool convertIpAddress(std::string const& text, Value& value) {
  if (text == "any")
    return true;
  size_t const slash = text.find('/');
  std::string const mask = slash == std::string::npos ? std::string() : text.substr(slash + 1);
  return value.ipAddress.set(text.substr(0, slash).c_str(), mask.c_str());
}

bool convertWord(std::string const&, Value&) {
  return true;
}

struct Kind {
  // What a value of this kind looks like, for "expected ..." messages.
  std::string description;
  bool (*convert)(std::string const& text, Value& value);
  // Set for enumerations: the accepted words, by value.
  std::vector<std::string> choices;
};

Kind enumeration(std::vector<std::string> choices) {
  std::string description = "one of ";
  for (size_t i = 0; i < choices.size(); ++i)
    description += (i == 0 ? "" : i + 1 == choices.size() ? " or " : ", ") + choices[i];
  return Kind{description, nullptr, std::move(choices)};
}

// Placeholder names and the kind of value each takes. A name not listed
// takes any word.
std::map<std::string, Kind> const& kinds() {
  static std::map<std::string, Kind> const table = [] {
    Kind const number{"a number from 0 to 4294967295", convertNumber, {}};
    Kind const hostPort{"a host-port such as example.com, *.example.com or 192.0.2.1:5060", convertHostPort, {}};
    Kind const nameAddr{"a name-addr such as sip:alice@example.com or \"Alice <sip:alice@example.com>\"",
                        convertNameAddr, {}};
    std::map<std::string, Kind> kinds;
    for (char const* name : {"index", "lifetime", "minimum", "maximum", "default", "priority", "traffic-class",
                             "timeout", "interval", "expires", "level"})
      kinds[name] = number;
    for (char const* name : {"host-port", "domain", "registrar", "tls-registrar", "notifier", "tls-notifier", "proxy",
                             "tls-proxy", "received", "destination", "tls-destination"})
      kinds[name] = hostPort;
    for (char const* name : {"contact", "name-addr"})
      kinds[name] = nameAddr;
    kinds["delta"] = Kind{"a whole number such as -1 or +2", convertDelta, {}};
    kinds["on|off"] = Kind{"on or off", convertSwitch, {}};
    kinds["ip-address"] = Kind{"any, an IP address, or address/mask such as 192.0.2.0/255.255.255.0",
                               convertIpAddress, {}};
    kinds["route"] = enumeration({"loose", "strict"});
    kinds["face"] = enumeration(faceNames());
    kinds["imperative"] = enumeration(textsOf<LS_Imperative>());
    kinds["identity-type"] = enumeration(textsOf<LS_IdentityType>());
    kinds["user-representation"] = enumeration(textsOf<LS_User>());
    kinds["preferred-protocol"] = enumeration(textsOf<LS_ProtocolConfig>());
    kinds["filter-type"] = enumeration(textsOf<LS_FilterType>());
    kinds["protocol"] = enumeration(textsOf<LS_AuthenticationProtocol>());
    kinds["registration-mode"] = enumeration(textsOf<LS_RegistrationMode>());
    kinds["uri-scheme"] = enumeration(textsOf<LS_UriScheme>());
    kinds["nat-traversal-method"] = enumeration(textsOf<LS_NatTraversalMethod>());
    kinds["keep-alive-method"] = enumeration(textsOf<LS_KeepAliveMethod>());
    kinds["mwi-subscription-mode"] = enumeration(textsOf<LS_MwiSubscriptionMode>());
    kinds["destination-type"] = enumeration(textsOf<LS_ForcedDestination>());
    return kinds;
  }();
  return table;
}

Kind const& kindOf(std::string const& placeholder) {
  static Kind const word{"a word", convertWord, {}};
  auto const found = kinds().find(placeholder);
  return found == kinds().end() ? word : found->second;
}

bool equalsIgnoringCase(std::string const& a, std::string const& b) {
  return a.size() == b.size() && std::equal(a.begin(), a.end(), b.begin(), [](char x, char y) {
           return std::tolower(static_cast<unsigned char>(x)) == std::tolower(static_cast<unsigned char>(y));
         });
}

// Throws, at the word, when the word is no value of the placeholder's kind.
Value convert(std::string const& placeholder, ScriptWord const& word) {
  Kind const& kind = kindOf(placeholder);
  Value value;
  value.text = word.text;
  value.column = word.column;
  if (!kind.choices.empty()) {
    auto const chosen = std::find_if(kind.choices.begin(), kind.choices.end(),
                                     [&](std::string const& choice) { return equalsIgnoringCase(choice, word.text); });
    if (chosen != kind.choices.end()) {
      value.number = static_cast<uint32_t>(chosen - kind.choices.begin());
      return value;
    }
  } else if (kind.convert(word.text, value)) {
    return value;
  }
  throw CommandError(word.column, "expected <" + placeholder + ">, " + kind.description + "; found \"" + word.text + "\"");
}

std::string quotedList(std::set<std::string> const& words) {
  std::string list;
  size_t shown = 0;
  for (std::string const& word : words) {
    if (shown == 12)
      return list + ", ...";
    list += (shown == 0 ? "" : ", ") + word;
    ++shown;
  }
  return list;
}

}  // namespace

std::string enumerationWord(char const* text) {
  std::string word;
  for (char const* c = text; *c; ++c)
    word += *c == ' ' ? '-' : static_cast<char>(std::tolower(static_cast<unsigned char>(*c)));
  return word;
}

std::vector<Arguments::Value> const& Arguments::all(char const* name) const {
  static std::vector<Value> const none;
  auto const found = m_values.find(name);
  return found == m_values.end() ? none : found->second;
}

// Why a command does not fit a line: the word where it stopped fitting
// (words().size() for the end of the line) and either what it expected
// there or the conversion's complaint.
struct CommandTable::Mismatch {
  size_t word = 0;
  std::string expected;
  std::string complaint;
  size_t column = 0;
};

void CommandTable::add(std::string const& pattern, std::string const& summary, Handler handler) {
  Command command{pattern, {}, summary, std::move(handler)};
  std::string text = pattern;
  size_t at = 0;
  while (at < text.size()) {
    size_t end = text.find(' ', at);
    if (end == std::string::npos)
      end = text.size();
    std::string word = text.substr(at, end - at);
    at = end + 1;
    Token token;
    token.optional = word.front() == '[';
    if (token.optional)
      word = word.substr(1, word.size() - 2);
    token.repeated = word.size() > 3 && word.compare(word.size() - 3, 3, "...") == 0;
    if (token.repeated)
      word.resize(word.size() - 3);
    token.placeholder = word.front() == '<';
    token.word = token.placeholder ? word.substr(1, word.size() - 2) : word;
    command.tokens.push_back(token);
  }
  m_commands.push_back(std::move(command));
}

bool CommandTable::match(Command const& command,
                         ScriptLine const& line,
                         Arguments& arguments,
                         Mismatch& mismatch) const {
  std::vector<ScriptWord> const& words = line.words();
  size_t next = 0;
  auto fail = [&](std::string const& expected, std::string const& complaint) {
    mismatch.word = next;
    mismatch.column = next < words.size() ? words[next].column : line.endColumn();
    mismatch.expected = expected;
    mismatch.complaint = complaint;
    return false;
  };
  for (Token const& token : command.tokens) {
    std::string const shown = token.placeholder ? "<" + token.word + ">" : token.word;
    if (next == words.size()) {
      if (token.optional)
        break;
      return fail(shown, std::string());
    }
    if (!token.placeholder) {
      if (words[next].quoted || words[next].text != token.word)
        return fail(shown, std::string());
      ++next;
      continue;
    }
    do {
      try {
        arguments.add(token.word, convert(token.word, words[next]));
      } catch (CommandError const& error) {
        return fail(shown, error.what());
      }
      ++next;
    } while (token.repeated && next < words.size());
  }
  if (next < words.size())
    return fail("the end of the line", std::string());
  return true;
}

void CommandTable::run(ScriptSession& session, ScriptLine const& line) const {
  if (line.words().empty())
    return;
  // The furthest any command fitted, and everything that would have fitted
  // there.
  Mismatch furthest;
  std::set<std::string> expected;
  std::set<std::string> complaints;
  for (Command const& command : m_commands) {
    Arguments arguments;
    Mismatch mismatch;
    if (match(command, line, arguments, mismatch)) {
      command.handler(session, arguments);
      return;
    }
    if (!expected.empty() && mismatch.word < furthest.word)
      continue;
    if (expected.empty() || mismatch.word > furthest.word) {
      furthest = mismatch;
      expected.clear();
      complaints.clear();
    }
    expected.insert(mismatch.expected);
    if (!mismatch.complaint.empty())
      complaints.insert(mismatch.complaint);
  }
  if (expected.size() == 1 && complaints.size() == 1)
    throw CommandError(furthest.column, *complaints.begin());
  std::string const found = furthest.word < line.words().size()
                                ? "; found \"" + line.words()[furthest.word].text + "\""
                                : "; found the end of the line";
  std::string const which = expected.size() == 1 ? "expected " : "expected one of: ";
  throw CommandError(furthest.column, which + quotedList(expected) + found);
}

std::string CommandTable::reference(std::string const& topic) const {
  std::string text;
  for (Command const& command : m_commands) {
    if (!topic.empty() && command.tokens.front().word != topic)
      continue;
    text += command.pattern + "\n    " + command.summary + "\n";
  }
  return text;
}

#include "registrar/SipUriComparison.h"

#include <algorithm>
#include <cctype>
#include <string>
#include <utility>
#include <vector>

namespace {

// libre's unescaping helpers, in the form %H prints with.
template <int (*unescape)(struct re_printf*, pl const*)>
int printUnescaped(struct re_printf* printer, void* text) {
  return unescape(printer, static_cast<pl const*>(text));
}

// The text with its %-escapes undone, lower-cased unless caseSensitive.
std::string plain(pl const& text, re_printf_h* unescaped, bool caseSensitive) {
  char* decoded = nullptr;
  if (re_sdprintf(&decoded, "%H", unescaped, const_cast<pl*>(&text)) != 0)
    return std::string(text.p, text.l);
  std::string result(decoded);
  mem_deref(decoded);
  if (!caseSensitive)
    std::transform(result.begin(), result.end(), result.begin(),
                   [](char c) { return static_cast<char>(std::tolower(static_cast<unsigned char>(c))); });
  return result;
}

using Components = std::vector<std::pair<std::string, std::string>>;

int collectParameter(pl const* name, pl const* value, void* components) {
  static_cast<Components*>(components)
      ->emplace_back(plain(*name, printUnescaped<uri_param_unescape>, false),
                     plain(*value, printUnescaped<uri_param_unescape>, false));
  return 0;
}

int collectHeader(pl const* name, pl const* value, void* components) {
  static_cast<Components*>(components)
      ->emplace_back(plain(*name, printUnescaped<uri_header_unescape>, false),
                     plain(*value, printUnescaped<uri_header_unescape>, false));
  return 0;
}

struct Parsed {
  bool secure;
  std::string user;
  std::string password;
  std::string host;
  uint16_t port;
  Components parameters;
  Components headers;
};

bool parse(pl const& text, Parsed& parsed) {
  uri decoded;
  if (uri_decode(&decoded, &text) != 0 || pl_isset(&decoded.path))
    return false;
  if (pl_strcasecmp(&decoded.scheme, "sip") == 0)
    parsed.secure = false;
  else if (pl_strcasecmp(&decoded.scheme, "sips") == 0)
    parsed.secure = true;
  else
    return false;
  parsed.user = plain(decoded.user, printUnescaped<uri_user_unescape>, true);
  parsed.password = plain(decoded.password, printUnescaped<uri_password_unescape>, true);
  parsed.host = plain(decoded.host, printUnescaped<uri_param_unescape>, false);
  parsed.port = decoded.port;
  if (pl_isset(&decoded.params) &&
      uri_params_apply(&decoded.params, collectParameter, &parsed.parameters) != 0)
    return false;
  return !pl_isset(&decoded.headers) ||
         uri_headers_apply(&decoded.headers, collectHeader, &parsed.headers) == 0;
}

std::string const* find(Components const& components, std::string const& name) {
  auto const found =
      std::find_if(components.begin(), components.end(),
                   [&](std::pair<std::string, std::string> const& c) { return c.first == name; });
  return found == components.end() ? nullptr : &found->second;
}

bool parametersMatch(Components const& a, Components const& b) {
  for (auto const& parameter : a) {
    std::string const* other = find(b, parameter.first);
    if (other && *other != parameter.second)
      return false;
  }
  for (char const* name : {"user", "ttl", "method", "maddr"})
    if ((find(a, name) == nullptr) != (find(b, name) == nullptr))
      return false;
  return true;
}

bool headersMatch(Components const& a, Components const& b) {
  if (a.size() != b.size())
    return false;
  for (auto const& header : a) {
    std::string const* other = find(b, header.first);
    if (!other || *other != header.second)
      return false;
  }
  return true;
}

}  // namespace

bool SipUriComparison::equal(pl const& a, pl const& b) {
  Parsed first;
  Parsed second;
  if (!parse(a, first) || !parse(b, second))
    return false;
  return first.secure == second.secure && first.user == second.user && first.password == second.password &&
         first.host == second.host && first.port == second.port &&
         parametersMatch(first.parameters, second.parameters) && headersMatch(first.headers, second.headers);
}

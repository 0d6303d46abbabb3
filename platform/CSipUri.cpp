#include "CSipUri.h"

#include "SipGrammar.h"

namespace {

bool isUserCharacter(unsigned char c) {
  return SipGrammar::isUnreserved(c) || SipGrammar::isOneOf(c, "&=+$,;?/");
}

bool isPasswordCharacter(unsigned char c) {
  return SipGrammar::isUnreserved(c) || SipGrammar::isOneOf(c, "&=+$,");
}

bool isHeaderCharacter(unsigned char c) {
  return SipGrammar::isUnreserved(c) || SipGrammar::isOneOf(c, "[]/?:+$");
}

// ";name[=value]" repeated; names and values are non-empty.
bool isParameterList(char const* text, size_t length) {
  size_t position = 0;
  while (position < length) {
    if (text[position] != ';')
      return false;
    size_t const begin = position + 1;
    size_t const end = SipGrammar::find(text, begin, length, ';');
    size_t const equals = SipGrammar::find(text, begin, end, '=');
    if (equals == begin || equals + 1 == end)
      return false;
    if (!SipGrammar::isEscapedRun(text + begin, equals - begin, SipGrammar::isParameterCharacter))
      return false;
    if (equals < end &&
        !SipGrammar::isEscapedRun(text + equals + 1, end - equals - 1, SipGrammar::isParameterCharacter))
      return false;
    position = end;
  }
  return true;
}

// "?name=value" then "&name=value" repeated; names are non-empty.
bool isHeaderList(char const* text, size_t length) {
  size_t position = 0;
  while (position < length) {
    if (text[position] != (position == 0 ? '?' : '&'))
      return false;
    size_t const begin = position + 1;
    size_t const end = SipGrammar::find(text, begin, length, '&');
    size_t const equals = SipGrammar::find(text, begin, end, '=');
    if (equals == begin || equals == end)
      return false;
    if (!SipGrammar::isEscapedRun(text + begin, end - begin,
                                  [](unsigned char c) { return c == '=' || isHeaderCharacter(c); }))
      return false;
    position = end;
  }
  return true;
}

// user[:password], the user non-empty.
bool isUserInfo(char const* text, size_t length) {
  size_t const colon = SipGrammar::find(text, 0, length, ':');
  if (colon == 0)
    return false;
  if (!SipGrammar::isEscapedRun(text, colon, isUserCharacter))
    return false;
  if (colon == length)
    return true;
  return SipGrammar::isEscapedRun(text + colon + 1, length - colon - 1, isPasswordCharacter);
}

}  // namespace

bool CSipUri::Parse(char const* text, size_t length) {
  if (text && assign(text, length))
    return true;
  Reset();
  return false;
}

bool CSipUri::assign(char const* text, size_t length) {
  size_t const colon = SipGrammar::find(text, 0, length, ':');
  if (colon == length)
    return false;
  bool secure = false;
  if (SipGrammar::equalsIgnoreCase(text, colon, "sips"))
    secure = true;
  else if (!SipGrammar::equalsIgnoreCase(text, colon, "sip"))
    return false;

  // '@' may appear unescaped only between the user info and the host.
  size_t const start = colon + 1;
  size_t const at = SipGrammar::find(text, start, length, '@');
  size_t hostBegin = start;
  if (at < length) {
    if (!isUserInfo(text + start, at - start))
      return false;
    hostBegin = at + 1;
  }
  size_t hostEnd = hostBegin;
  while (hostEnd < length && text[hostEnd] != ';' && text[hostEnd] != '?')
    ++hostEnd;
  size_t const headers = SipGrammar::find(text, hostEnd, length, '?');
  CHostPort hostPort;
  if (!hostPort.ParseUriHostPort(text + hostBegin, hostEnd - hostBegin))
    return false;
  if (!isParameterList(text + hostEnd, headers - hostEnd) || !isHeaderList(text + headers, length - headers))
    return false;

  // Built before anything is stored: text may point into this value.
  CString user;
  if (at < length)
    user = CString(text + start, SipGrammar::find(text, start, at, ':') - start);
  m_secure = secure;
  m_user = user;
  m_hostPort = hostPort;
  return true;
}

void CSipUri::Reset() {
  m_secure = false;
  m_user = CString();
  m_hostPort.Reset();
}

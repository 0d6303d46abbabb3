#include "CNameAddr.h"

#include <string>

#include "SipGrammar.h"

namespace {

// Bytes of UTF-8 sequences are let through unchecked, as the stack does for
// display names.
bool isTokenCharacter(unsigned char c) {
  return SipGrammar::isAlphaNum(c) || c >= 0x80 || SipGrammar::isOneOf(c, "-.!%*_+`'~");
}

bool isControl(unsigned char c) {
  return c < 0x20 || c == 0x7f;
}

// The characters of an absolute URI of a scheme the stack does not know.
bool isGenericUriCharacter(unsigned char c) {
  return SipGrammar::isUnreserved(c) || SipGrammar::isOneOf(c, ":/?#[]@$&+,;=");
}

size_t skipWhiteSpace(char const* text, size_t position, size_t end) {
  while (position < end && SipGrammar::isWhiteSpace(static_cast<unsigned char>(text[position])))
    ++position;
  return position;
}

// Reads the quoted string that starts at text[position] into out; on
// success position is just past the closing quote.
bool readQuotedString(char const* text, size_t& position, size_t end, std::string& out) {
  for (size_t i = position + 1; i < end; ++i) {
    unsigned char c = static_cast<unsigned char>(text[i]);
    if (c == '"') {
      position = i + 1;
      return true;
    }
    if (c == '\\') {
      if (++i == end)
        return false;
      c = static_cast<unsigned char>(text[i]);
    }
    if (isControl(c) && c != '\t')
      return false;
    out.push_back(static_cast<char>(c));
  }
  return false;
}

bool isDisplayWords(char const* text, size_t length) {
  for (size_t i = 0; i < length; ++i) {
    unsigned char const c = static_cast<unsigned char>(text[i]);
    if (!isTokenCharacter(c) && !SipGrammar::isWhiteSpace(c))
      return false;
  }
  return true;
}

void append(CBlob& out, char const* text, size_t length) {
  out.Insert(out.GetSize(), reinterpret_cast<unsigned char const*>(text), static_cast<unsigned int>(length));
}

}  // namespace

bool CNameAddr::Parse(char const* text, size_t length) {
  // Parsed into a fresh value first: text may point into this one.
  CNameAddr parsed;
  if (text && parsed.assign(text, length)) {
    *this = parsed;
    return true;
  }
  Reset();
  return false;
}

bool CNameAddr::assign(char const* text, size_t length) {
  size_t const begin = skipWhiteSpace(text, 0, length);
  size_t end = length;
  while (end > begin && SipGrammar::isWhiteSpace(static_cast<unsigned char>(text[end - 1])))
    --end;
  if (begin == end)
    return false;

  std::string displayName;
  size_t open = end;
  if (text[begin] == '"') {
    size_t position = begin;
    if (!readQuotedString(text, position, end, displayName))
      return false;
    open = skipWhiteSpace(text, position, end);
    if (open == end || text[open] != '<')
      return false;
  } else {
    open = SipGrammar::find(text, begin, end, '<');
    if (open < end) {
      size_t wordsEnd = open;
      while (wordsEnd > begin && SipGrammar::isWhiteSpace(static_cast<unsigned char>(text[wordsEnd - 1])))
        --wordsEnd;
      if (!isDisplayWords(text + begin, wordsEnd - begin))
        return false;
      displayName.assign(text + begin, wordsEnd - begin);
    }
  }

  // A bare URI is the whole text; otherwise the URI runs from '<' to
  // a '>' that must be the last character.
  if (open == end)
    return parseUri(text + begin, end - begin);
  size_t const close = SipGrammar::find(text, open + 1, end, '>');
  if (close + 1 != end || !parseUri(text + open + 1, close - open - 1))
    return false;
  m_displayName = CString(displayName.data(), displayName.size());
  return true;
}

bool CNameAddr::parseUri(char const* text, size_t length) {
  size_t const colon = SipGrammar::find(text, 0, length, ':');
  if (colon == 0 || colon == length || !SipGrammar::isAlpha(static_cast<unsigned char>(text[0])))
    return false;
  for (size_t i = 1; i < colon; ++i) {
    unsigned char const c = static_cast<unsigned char>(text[i]);
    if (!SipGrammar::isAlphaNum(c) && c != '+' && c != '-' && c != '.')
      return false;
  }

  unsigned int kind = URI_OTHER;
  if (SipGrammar::equalsIgnoreCase(text, colon, "sip") || SipGrammar::equalsIgnoreCase(text, colon, "sips")) {
    if (!m_sipUri.Parse(text, length))
      return false;
    kind = m_sipUri.IsSecure() ? URI_SIPS : URI_SIP;
  } else if (SipGrammar::equalsIgnoreCase(text, colon, "tel")) {
    if (!m_telUri.Parse(text, length))
      return false;
    kind = URI_TEL;
  } else if (colon + 1 == length ||
             !SipGrammar::isEscapedRun(text + colon + 1, length - colon - 1, isGenericUriCharacter)) {
    return false;
  }
  m_uriKind = kind;
  m_uri = CString(text, length);
  return true;
}

void CNameAddr::Serialize(CBlob& out) const {
  if (m_uriKind == URI_NONE)
    return;
  if (!m_displayName.isEmpty()) {
    std::string quoted = "\"";
    for (size_t i = 0; i < m_displayName.length(); ++i) {
      char const c = m_displayName.c_str()[i];
      if (c == '"' || c == '\\')
        quoted.push_back('\\');
      quoted.push_back(c);
    }
    quoted += "\" ";
    append(out, quoted.data(), quoted.size());
  }
  append(out, "<", 1);
  append(out, m_uri.c_str(), m_uri.length());
  append(out, ">", 1);
}

CSipUri const* CNameAddr::GetSipUri() const {
  if (m_uriKind != URI_SIP && m_uriKind != URI_SIPS)
    return nullptr;
  return &m_sipUri;
}

CTelUri const* CNameAddr::GetTelUri() const {
  if (m_uriKind != URI_TEL)
    return nullptr;
  return &m_telUri;
}

void CNameAddr::Reset() {
  m_displayName = CString();
  m_uriKind = URI_NONE;
  m_uri = CString();
  m_sipUri = CSipUri();
  m_telUri = CTelUri();
}

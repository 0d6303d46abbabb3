#include "CTelUri.h"

#include "SipGrammar.h"

namespace {

bool isVisualSeparator(unsigned char c) {
  return c == '-' || c == '.' || c == '(' || c == ')';
}

bool isNumber(char const* text, size_t length) {
  bool const global = length > 0 && text[0] == '+';
  bool sawDigit = false;
  for (size_t i = global ? 1 : 0; i < length; ++i) {
    unsigned char const c = static_cast<unsigned char>(text[i]);
    if (isVisualSeparator(c))
      continue;
    bool const digit = global ? SipGrammar::isDigit(c) : (SipGrammar::isHexDigit(c) || c == '*' || c == '#');
    if (!digit)
      return false;
    sawDigit = true;
  }
  return sawDigit;
}

bool isPhoneContext(char const* text, size_t length) {
  if (length > 0 && text[0] == '+')
    return isNumber(text, length);
  return SipGrammar::isHostName(text, length);
}

bool isParameterNameCharacter(unsigned char c) {
  return SipGrammar::isAlphaNum(c) || c == '-';
}

}  // namespace

bool CTelUri::Parse(char const* text, size_t length) {
  if (text && assign(text, length))
    return true;
  Reset();
  return false;
}

bool CTelUri::assign(char const* text, size_t length) {
  size_t const colon = SipGrammar::find(text, 0, length, ':');
  if (colon == length || !SipGrammar::equalsIgnoreCase(text, colon, "tel"))
    return false;
  size_t const numberBegin = colon + 1;
  size_t const numberEnd = SipGrammar::find(text, numberBegin, length, ';');
  if (!isNumber(text + numberBegin, numberEnd - numberBegin))
    return false;

  bool hasPhoneContext = false;
  size_t phoneContextBegin = 0;
  size_t phoneContextEnd = 0;
  for (size_t position = numberEnd; position < length;) {
    size_t const begin = position + 1;
    size_t const end = SipGrammar::find(text, begin, length, ';');
    size_t const equals = SipGrammar::find(text, begin, end, '=');
    if (equals == begin || equals + 1 == end)
      return false;
    for (size_t i = begin; i < equals; ++i) {
      if (!isParameterNameCharacter(static_cast<unsigned char>(text[i])))
        return false;
    }
    if (equals < end &&
        !SipGrammar::isEscapedRun(text + equals + 1, end - equals - 1, SipGrammar::isParameterCharacter))
      return false;
    if (SipGrammar::equalsIgnoreCase(text + begin, equals - begin, "phone-context")) {
      if (hasPhoneContext || equals == end || !isPhoneContext(text + equals + 1, end - equals - 1))
        return false;
      hasPhoneContext = true;
      phoneContextBegin = equals + 1;
      phoneContextEnd = end;
    }
    position = end;
  }

  // Built before anything is stored: text may point into this value.
  CString number(text + numberBegin, numberEnd - numberBegin);
  CString phoneContext(text + phoneContextBegin, phoneContextEnd - phoneContextBegin);
  m_number = number;
  m_hasPhoneContext = hasPhoneContext;
  m_phoneContext = phoneContext;
  return true;
}

void CTelUri::Reset() {
  m_number = CString();
  m_hasPhoneContext = false;
  m_phoneContext = CString();
}

#include "IDriver.h"

namespace {

// Appends text with "%" and "/" escaped, so that a field of the name never
// contains the separator.
void appendEscaped(String& out, String const& text) {
  size_t runStart = 0;
  for (size_t i = 0; i < text.length(); ++i) {
    char const* const escape = text[i] == '%' ? "%25" : text[i] == '/' ? "%2F" : nullptr;
    if (!escape)
      continue;
    out.append(String(text.c_str() + runStart, i - runStart)).append(escape);
    runStart = i + 1;
  }
  out.append(String(text.c_str() + runStart, text.length() - runStart));
}

}  // namespace

UUID const& IDriver::IID() {
  static UUID const id("63888f73-b58b-4ae5-8d61-c29c5b536bd1", "IDriver");
  return id;
}

void IDriver::BUILD_DRIVER_NAME(String& out,
                                String const& base,
                                unsigned int number1,
                                unsigned int number2,
                                unsigned int number3,
                                String const& text1,
                                String const& text2,
                                String const& text3,
                                String const& text4) {
  // Built aside: out may be one of the arguments.
  String name;
  appendEscaped(name, base);
  name.concatf("/%u/%u/%u", number1, number2, number3);
  for (String const* text : {&text1, &text2, &text3, &text4}) {
    name.append("/");
    appendEscaped(name, *text);
  }
  out = name;
}

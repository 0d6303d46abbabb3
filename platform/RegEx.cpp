#include "RegEx.h"

#include <re2/re2.h>

struct RegEx::Pattern::Compiled {
  explicit Compiled(String const& expression, RE2::Options const& options)
      : re(re2::StringPiece(expression.c_str(), expression.length()), options) {}

  RE2 re;
};

namespace {

RE2::Options patternOptions() {
  RE2::Options options;
  options.set_encoding(RE2::Options::EncodingLatin1);
  // A bad expression from configuration is reported by a null pattern, not
  // by a line on the host's standard error.
  options.set_log_errors(false);
  return options;
}

}  // namespace

RegEx::Pattern::Pattern(std::unique_ptr<Compiled> compiled) : m_compiled(std::move(compiled)) {}

RegEx::Pattern::~Pattern() = default;

unsigned int RegEx::Pattern::addRef() {
  return m_refCount.fetch_add(1, std::memory_order_relaxed) + 1;
}

unsigned int RegEx::Pattern::release() {
  unsigned int const remaining = m_refCount.fetch_sub(1, std::memory_order_acq_rel) - 1;
  if (remaining == 0)
    delete this;
  return remaining;
}

XCode RegEx::Pattern::match(String const& text, unsigned int start) const {
  if (start > text.length())
    return XCode::failure();
  re2::StringPiece const rest(text.c_str() + start, text.length() - start);
  if (!RE2::FullMatch(rest, m_compiled->re))
    return XCode::failure();
  return XCode::success();
}

RefPtr<RegEx::Pattern> RegEx::COMPILE_EXPRESSION(String const& expression) {
  auto compiled = std::make_unique<Pattern::Compiled>(expression, patternOptions());
  if (!compiled->re.ok())
    return nullptr;
  return adoptRef(new Pattern(std::move(compiled)));
}

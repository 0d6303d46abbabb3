// RegEx: the utility library's regular expressions, as the identity's alias
// expressions use them. Search, replace and capture groups do not belong
// here, and the engine is the source's business: callers see none of it.
//
// Alias expressions come from configuration but are matched against user
// parts that arrive from the network, so the engine guarantees matching time
// linear in the text: no configured expression can be turned into a denial
// of service. Matching is byte-wise (Latin-1, no UTF-8 decoding), so any
// bytes from the network are safe to match; an expression that needs
// backreferences or lookaround does not compile.
#pragma once

#include "Export.h"

#include <atomic>
#include <memory>

#include "RefPtr.h"
#include "String.h"
#include "XCode.h"

class LS_EXPORT RegEx {
 public:
  // A compiled expression. Created by COMPILE_EXPRESSION with a count of 1,
  // adopted by the RefPtr it returns; dies at its last release. Immutable
  // after compilation, so one pattern may be matched on several threads at
  // once and shared between alias records.
  class Pattern {
   public:
    Pattern(Pattern const&) = delete;
    Pattern& operator=(Pattern const&) = delete;

    unsigned int addRef();
    unsigned int release();

    // Success when the expression matches text from byte start to the end
    // of the text: the match is anchored at start and must cover the whole
    // rest, because an alias expression describes a whole user part ("1[0-9]{3}"
    // claims "1000" but neither "10000" nor "1000x"). The rest is matched as
    // a text of its own, so "^" and "$" anchor at start and at the end. start
    // equal to the length matches the empty rest; start past the end fails.
    XCode match(String const& text, unsigned int start) const;

   private:
    friend class RegEx;
    struct Compiled;

    explicit Pattern(std::unique_ptr<Compiled> compiled);
    ~Pattern();

    std::atomic<unsigned int> m_refCount{1};
    std::unique_ptr<Compiled> const m_compiled;
  };

  // The compiled expression, or null when expression does not compile.
  static RefPtr<Pattern> COMPILE_EXPRESSION(String const& expression);
};

// testExpression: turns a condition into a result, success when it holds and
// failure without message otherwise; pointers and counted references are
// tested for null.
#pragma once

#include "RefPtr.h"
#include "XCode.h"

inline XCode testExpression(bool condition) {
  return condition ? XCode::success() : XCode::failure();
}

template <class T>
XCode testExpression(T const* pointer) {
  return testExpression(pointer != nullptr);
}

template <class T>
XCode testExpression(RefPtr<T> const& reference) {
  return testExpression(reference.get() != nullptr);
}

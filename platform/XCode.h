// XCode: the result of an operation, success or failure. A failure may carry
// a message for people; code decides on isSuccess()/isFailure() only.
#pragma once

#include "Export.h"

#include "String.h"

class LS_EXPORT XCode {
 public:
  // Success.
  XCode() = default;

  static XCode success() { return XCode(); }
  static XCode failure() { return XCode(true, String()); }
  static XCode failure(String const& message) { return XCode(true, message); }

  bool isSuccess() const { return !m_failed; }
  bool isFailure() const { return m_failed; }
  // Empty for success and for a failure without message.
  String const& message() const { return m_message; }

  // Results compare by outcome; the message is commentary.
  bool operator==(XCode const& other) const { return m_failed == other.m_failed; }
  bool operator!=(XCode const& other) const { return m_failed != other.m_failed; }

 private:
  XCode(bool failed, String const& message) : m_failed(failed), m_message(message) {}

  bool m_failed = false;
  String m_message;
};

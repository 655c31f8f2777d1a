/// How the two contracts show an Error: as an exception, or as a status of the management API. What the
/// description has an operation answered with decides by itself.
#pragma once

#include <cstdint>
#include <string>

#include "host/Call.h"
#include "host/Storage.h"

#pragma GCC visibility push(default)

namespace host {

/// An operation was answered so by the description.
class AnsweredError : public Error {
 public:
  /// The exceptions of the control library.
  enum class Thrown { NodeCtlException, CoreCtlException };
  AnsweredError(Thrown thrown, const std::string& text);
  /// @p imaStatus is other than 0.
  explicit AnsweredError(std::uint32_t imaStatus);

  Thrown GetThrown() const { return thrown_; }
  /// 0 where an exception was the answer.
  std::uint32_t ImaStatus() const { return imaStatus_; }

 private:
  Thrown thrown_ = Thrown::NodeCtlException;
  std::uint32_t imaStatus_ = 0;
};

/// Which exception shows @p error where an operation of @p style fails with it.
AnsweredError::Thrown ThrownFor(const Error& error, Call::Style style);
/// The status with which a call of the management API shows it; never 0.
std::uint32_t ImaStatusOf(const Error& error);
/// A status of the management API as the trace shows it.
std::string ImaStatusText(std::uint32_t status);

}  // namespace host

#pragma GCC visibility pop

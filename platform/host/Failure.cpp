#include "host/Failure.h"

#include <ima/ima.h>

#include <cstdio>

namespace host {

namespace {

using Kind = Error::Kind;

Kind KindOf(std::uint32_t imaStatus) {
  switch (imaStatus) {
    case IMA_ERROR_NOT_SUPPORTED:
      return Kind::NotSupported;
    case IMA_ERROR_INSUFFICIENT_MEMORY:
      return Kind::NoMemory;
    case IMA_ERROR_INVALID_PARAMETER:
    case IMA_ERROR_INVALID_OBJECT_TYPE:
    case IMA_ERROR_INCORRECT_OBJECT_TYPE:
      return Kind::Invalid;
    case IMA_ERROR_OBJECT_NOT_FOUND:
      return Kind::NotFound;
    case IMA_ERROR_SYNC_TIMEOUT:
      return Kind::NoAnswer;
    default:
      return Kind::Failed;
  }
}

}  // namespace

AnsweredError::AnsweredError(Thrown thrown, const std::string& text)
    : Error(Kind::Failed, text), thrown_(thrown) {}

AnsweredError::AnsweredError(std::uint32_t imaStatus)
    : Error(KindOf(imaStatus), "The host description has it answered with " + ImaStatusText(imaStatus) + "."),
      imaStatus_(imaStatus) {}

AnsweredError::Thrown ThrownFor(const Error& error, Call::Style style) {
  if (const auto* const answered = dynamic_cast<const AnsweredError*>(&error)) return answered->GetThrown();
  return style == Call::Style::Lookup ? AnsweredError::Thrown::CoreCtlException
                                      : AnsweredError::Thrown::NodeCtlException;
}

std::uint32_t ImaStatusOf(const Error& error) {
  const auto* const answered = dynamic_cast<const AnsweredError*>(&error);
  if (answered != nullptr && answered->ImaStatus() != 0) return answered->ImaStatus();
  switch (error.GetKind()) {
    case Kind::NotFound:
      return IMA_ERROR_OBJECT_NOT_FOUND;
    case Kind::Exists:
    case Kind::Invalid:
    case Kind::OutOfRange:
    case Kind::NotSettable:
    case Kind::WrongState:
    case Kind::InUse:
    case Kind::TooMany:
      return IMA_ERROR_INVALID_PARAMETER;
    case Kind::NotSupported:
      return IMA_ERROR_NOT_SUPPORTED;
    case Kind::WrongObject:
      return IMA_ERROR_INCORRECT_OBJECT_TYPE;
    case Kind::NoMemory:
      return IMA_ERROR_INSUFFICIENT_MEMORY;
    case Kind::LoginRefused:
    case Kind::NoAnswer:
      return IMA_ERROR_UNKNOWN_ERROR;
    case Kind::Failed:
    case Kind::Busy:
    case Kind::Denied:
    case Kind::Damaged:
    case Kind::DamagedFile:
    case Kind::NoSpace:
      return IMA_ERROR_UNEXPECTED_OS_ERROR;
  }
  return IMA_ERROR_UNEXPECTED_OS_ERROR;
}

std::string ImaStatusText(std::uint32_t status) {
  char text[16];
  std::snprintf(text, sizeof text, "0x%08x", static_cast<unsigned>(status));
  return text;
}

}  // namespace host

#include "corectl/Operation.h"

#include "host/Failure.h"

namespace corectl {

void Throw(const host::Error& error, host::Call::Style style) {
  if (host::ThrownFor(error, style) == host::AnsweredError::Thrown::CoreCtlException) {
    throw CoreCtl::Lib::CoreCtlException(error.what(), "corectl/Operation.cpp", __LINE__, {});
  }
  throw NodeCtl::Lib::NodeCtlException(error.what(), {});
}

void RefuseValue(const std::string& text) { throw NodeCtl::Lib::NodeCtlException(text, {}); }

void Deny(Why why, const std::string& text) { throw host::Error(why, text); }

}  // namespace corectl

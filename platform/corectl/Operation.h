/// What every operation of this library runs in: host failures leave it as the exceptions of the contract.
#pragma once

#include <CoreCtl/Exception.h>

#include "host/Host.h"

namespace corectl {

/// Throws @p error as the exception that the contract promises for an operation of this style.
[[noreturn]] void Throw(const host::Error& error, host::Call::Style style);

/// Refuses what a value is made from, outside any operation: a NodeCtlException of @p text.
[[noreturn]] void RefuseValue(const std::string& text);

/// Refuses an operation from within its body, for the reason @p text: a host::Error.
[[noreturn]] void Deny(const std::string& text);

/// Gives @p owned to a caller who deletes the elements.
template <class T>
std::vector<T*> HandOut(std::vector<std::unique_ptr<T>> owned) {
  std::vector<T*> handedOut(owned.size());
  for (std::size_t i = 0; i < owned.size(); ++i) handedOut[i] = owned[i].release();
  return handedOut;
}

/// How an operation runs at the host's choke point: Read, Change or Outside.
#define CORECTL_RUN(how)                            \
  template <class Body>                             \
  auto how(const host::Call& call, Body&& body) {   \
    try {                                           \
      return host::Host::Current().how(call, body); \
    } catch (const host::Error& error) {            \
      Throw(error, call.style);                     \
    }                                               \
  }
CORECTL_RUN(Read)
CORECTL_RUN(Change)
CORECTL_RUN(Outside)
#undef CORECTL_RUN

}  // namespace corectl

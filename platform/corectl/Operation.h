/// What every operation of this library runs in: host failures leave it as the exceptions of the contract.
#pragma once

#include <CoreCtl/Exception.h>

#include "host/Host.h"

namespace corectl {

/// Throws @p error as the exception that the contract promises for an operation of this style.
[[noreturn]] void Throw(const host::Error& error, host::Call::Style style);

/// Refuses what a value is made from, outside any operation: a NodeCtlException of @p text.
[[noreturn]] void RefuseValue(const std::string& text);

using Why = host::Error::Kind;
/// Refuses an operation from within its body, for the reason @p text: a host::Error.
[[noreturn]] void Deny(Why why, const std::string& text);

/// Gives @p owned to a caller who deletes the elements.
template <class T>
std::vector<T*> HandOut(std::vector<std::unique_ptr<T>> owned) {
  std::vector<T*> handedOut(owned.size());
  for (std::size_t i = 0; i < owned.size(); ++i) handedOut[i] = owned[i].release();
  return handedOut;
}

/// What @p work gives; a host failure as the exception of an operation of this style.
template <class Work>
auto WithExceptions(host::Call::Style style, Work work) {
  try {
    return work();
  } catch (const host::Error& error) {
    Throw(error, style);
  }
}

// How operations run at the host's choke point.
template <class Body>
auto Read(const host::Call& call, Body&& body) {
  return WithExceptions(call.style, [&] { return host::Host::Current().Read(call, body); });
}
template <class Body>
auto Change(const host::Call& call, Body&& body) {
  return WithExceptions(call.style, [&] { return host::Host::Current().Change(call, body); });
}
template <class Body>
auto Outside(const host::Call& call, Body&& body) {
  return WithExceptions(call.style, [&] { return host::Host::Current().Outside(call, body); });
}

}  // namespace corectl

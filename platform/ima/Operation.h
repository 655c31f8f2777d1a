/// What every IMA call runs in: one transaction at the host's choke point, failures as a status.
#pragma once

#include <ima/ima.h>

#include <new>
#include <string_view>

#include "host/Failure.h"
#include "host/Host.h"
#include "ima/Memory.h"

namespace ima {

/// The status that stands for what @p work throws, or success.
template <class Work>
IMA_STATUS StatusOf(const Work& work) noexcept try {
  work();
  return IMA_STATUS_SUCCESS;
} catch (const host::Error& error) {
  return host::ImaStatusOf(error);
} catch (const std::bad_alloc&) {
  return IMA_ERROR_INSUFFICIENT_MEMORY;
} catch (...) {
  return IMA_ERROR_UNKNOWN_ERROR;
}

/// Runs @p body with a Tree& and gives the status: what it throws is a failure, all else success. The body
/// sets the out parameters as its last step. What it returns as an Error
/// is a failure of a call that has changed something all the same.
template <class Body>
IMA_STATUS Read(const host::Call& call, Body&& body) noexcept {
  return StatusOf([&] { host::Host::Current().Read(call, body); });
}
template <class Body>
IMA_STATUS Change(const host::Call& call, Body&& body) noexcept {
  return StatusOf([&] { host::Host::Current().Change(call, body); });
}

/// The object ids on both sides: the sequence number of an OID is the id of the host's object.
inline IMA_OID Oid(IMA_OBJECT_TYPE type, std::int64_t id) { return {type, 1, static_cast<IMA_UINT64>(id)}; }
inline std::int64_t Id(const IMA_OID& oid) { return static_cast<std::int64_t>(oid.objectSequenceNumber); }

/// The objects @p ids as a list.
inline Owned<IMA_OID_LIST> OidList(IMA_OBJECT_TYPE type, const std::vector<std::int64_t>& ids) {
  auto list = NewList<IMA_OID_LIST, IMA_OID>(ids.size());
  list->oidCount = static_cast<IMA_UINT>(ids.size());
  for (std::size_t i = 0; i < ids.size(); ++i) list->oids[i] = Oid(type, ids[i]);
  return list;
}

}  // namespace ima

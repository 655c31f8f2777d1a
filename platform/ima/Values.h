/// Values of records in the forms of this API.
#pragma once

#include <ima/ima.h>

#include <string>
#include <string_view>

#include "host/Call.h"
#include "host/Storage.h"

namespace ima {

/// The object of a call as the trace shows it.
host::Argument OidArgument(const IMA_OID& oid);
/// The id of @p oid; an Error (WrongObject) when it is of another type.
std::int64_t IdOfType(const IMA_OID& oid, IMA_OBJECT_TYPE type);

/// @p text, UTF-8, cut where it does not fit with its terminator.
void SetWide(IMA_WCHAR* destination, std::size_t size, std::string_view text);
template <std::size_t size>
void SetWide(IMA_WCHAR (&destination)[size], std::string_view text) {
  SetWide(destination, size, text);
}
/// A file's name as UTF-8; an Error (Invalid) where it has none.
std::string Narrow(const IMA_WCHAR* wide);

/// All zero for a text that is no address.
IMA_IP_ADDRESS Address(std::string_view text);
std::string AddressText(const IMA_IP_ADDRESS& address);
/// A time of a record, "2026-11-22 14:03:22". What it says is not checked: a library may hand out anything.
IMA_DATETIME Time(const std::string& text);

inline IMA_UINT32 Unsigned(const host::Record& record, std::string_view key) {
  return static_cast<IMA_UINT32>(record.GetInt64(key));
}
inline IMA_UINT16 Unsigned16(const host::Record& record, std::string_view key) {
  return static_cast<IMA_UINT16>(record.GetInt64(key));
}
inline IMA_BOOL Bool(const host::Record& record, std::string_view key) {
  return record.GetBool(key) ? IMA_TRUE : IMA_FALSE;
}

}  // namespace ima

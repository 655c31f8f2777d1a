/// iSNS servers and the one parameter of iSNS discovery, which an adapter has for itself and for each server.
#pragma once

#include <optional>
#include <string>

#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {

using NodeCtl::Storage::iSnsConfig;
using NodeCtl::Storage::iSnsParms;

/// The server that the options `method` and `address` name. Nothing when they name none, which is then
/// reported, with @p addressFailure behind the reason where the address is malformed.
std::optional<iSnsConfig> ServerNamed(const std::string& method, const std::string& address,
                                      const char* addressFailure, const OutputPtr& output);

/// Posts the row of the parameter. One that the place does not have is shown by its name alone.
void ShowIsnsParm(const iSnsParms& parms, const OutputPtr& output);

constexpr Option IsnsAddress(const char* help) { return StringOption("address", 'a', help); }
inline constexpr char kIsnsMethodHelp[] =
    "The iSNS discovery method: <static/dhcp/slp>. Only static supported.";
constexpr Option IsnsMethod(const char* help = kIsnsMethodHelp) {
  return StringOption("method", 'm', help).Required();
}

}  // namespace TessaroCli::IscsiNamespace

/// What the route commands share.
#pragma once

#include <cstring>

#include "ImaWalk.h"

namespace TessaroCli::IscsiNamespace {

/// An entry, and the adapter that it is for, as the user wrote them.
struct RouteText {
  std::string adapter;
  std::string destination;
  std::string netmask;
  std::string gateway;
  std::string nic;
  IMA_UINT32 metric = 1;  ///< the low 32 bits of the number given
};

/// The options of adding an entry and of removing it.
inline constexpr Option kRouteOptions[] = {
    AdapterOption(),
    StringOption("destination", 's', "The route entry's denstination subnet.").Required(),
    StringOption("netmask", 'm', "The route entry's subnet mask."),
    StringOption("gateway", 'g', "The route entry's gateway.").Required(),
    StringOption("metric", 'c', "The route entry's metric."),
    StringOption("nic", 'n', "The iSCSI network portal (hostnic) to associate to.").Required(),
};

// Each reports what it refuses, and what it does not find. A failed call throws ImaFailure.

std::optional<RouteText> ReadRoute(const Plinth::CallSpec::Input& input, const OutputPtr& output);
std::optional<IMA_OID> FindRouteAdapter(const std::string& name, const OutputPtr& output);
/// The network portal of @p adapter that is called @p nic.
std::optional<IMA_OID> FindPortal(const IMA_OID& adapter, const std::string& nic, const OutputPtr& output);

/// Compares names as far as an interface name can hold them; one that fills its array has no zero.
inline bool IsInterface(const char (&name)[IMA_TSR_INTERFACE_NAME_SIZE], const std::string& text) {
  return std::strncmp(name, text.c_str(), sizeof name) == 0;
}

}  // namespace TessaroCli::IscsiNamespace

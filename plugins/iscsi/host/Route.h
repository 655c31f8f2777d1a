/// What the route commands share.
#pragma once

#include <cstring>
#include <functional>

#include "ImaWalk.h"

namespace TessaroCli::IscsiNamespace {

/// An entry as the user wrote it.
struct RouteText {
  std::string destination;
  std::string netmask;
  std::string gateway;
  std::string nic;
  long metric;  ///< as it was given: one that no entry can have matches none
};

/// The parameters of adding an entry and of removing it.
inline constexpr Parameter kRouteParameters[] = {
    Adapter(),
    String("destination", 's', "The route entry's denstination subnet.").Required(),
    String("netmask", 'm', "The route entry's subnet mask."),
    String("gateway", 'g', "The route entry's gateway.").Required(),
    String("metric", 'c', "The route entry's metric."),
    String("nic", 'n', "The iSCSI network portal (hostnic) to associate to.").Required(),
};

/// Reads the entry, looks its adapter up and runs @p steps on both. Wrong input is reported, and so is the
/// failed call that ends the steps.
void WithRoute(const InputPtr& input, const OutputPtr& output,
               const std::function<void(const IMA_OID& adapter, const RouteText& route)>& steps);

/// The network portal of @p adapter that is called @p nic. Throws ImaFailure.
IMA_OID FindPortal(const IMA_OID& adapter, const std::string& nic);

/// Compares names as far as an interface name can hold them; one that fills its array has no zero.
inline bool IsInterface(const char (&name)[IMA_TSR_INTERFACE_NAME_SIZE], const std::string& text) {
  return std::strncmp(name, text.c_str(), sizeof name) == 0;
}

}  // namespace TessaroCli::IscsiNamespace

#include "host/Route.h"

#include <cstdio>
#include <cstdlib>

namespace TessaroCli::IscsiNamespace {
namespace {

using IscsiUtil::ImaFailure;

/// The first number in @p text, 0 where there is none. What stands behind it does not count.
long NumberIn(const std::string& text) { return std::strtol(text.c_str(), nullptr, 10); }

/// The mask of the first @p prefixLength bits of 32.
std::string NetmaskText(long prefixLength) {
  if (prefixLength < 0 || prefixLength > 32) throw ImaFailure{InvalidAddressMessage};
  const unsigned mask = prefixLength == 0 ? 0 : 0xffffffffU << (32 - prefixLength);
  char text[sizeof "255.255.255.255"];
  std::snprintf(text, sizeof text, "%u.%u.%u.%u", mask >> 24, mask >> 16 & 0xff, mask >> 8 & 0xff,
                mask & 0xff);
  return text;
}

/// Splits "network/prefix length", or "default", into destination and netmask.
void DeriveNetmask(RouteText& route) {
  static constexpr char kAny[] = "0.0.0.0";
  if (route.destination == "default") {
    route.destination = route.netmask = kAny;
    return;
  }
  const std::size_t slash = route.destination.find('/');
  if (slash == std::string::npos) throw ImaFailure{InvalidAddressMessage};
  route.netmask = NetmaskText(NumberIn(route.destination.substr(slash + 1)));
  route.destination.resize(slash);
}

RouteText ReadRoute(const Plinth::CallSpec::Input& input) {
  RouteText route{.destination = input.GetString("destination"),
                  .netmask = {},
                  .gateway = input.GetString("gateway"),
                  .nic = input.GetString("nic"),
                  .metric = 1};
  if (!input.HasParameter("destination") || !input.HasParameter("gateway")) {
    throw ImaFailure{
        "Please input at least destination and gateway parameter together.e.g. \"default 192.168.1.1\""};
  }
  if (input.HasParameter("netmask")) {
    route.netmask = input.GetString("netmask");
  } else {
    DeriveNetmask(route);
  }
  if (input.HasParameter("metric")) route.metric = NumberIn(input.GetString("metric"));
  return route;
}

IMA_OID AdapterOf(const Plinth::CallSpec::Input& input) {
  const ImaList adapters(InvalidAdapterMessage, IMA_GetLhbaOidList);
  const auto adapter =
      IscsiUtil::FindLogicalAdapter(adapters, input.GetString("adapter"), InvalidAdapterMessage);
  if (!adapter) throw ImaFailure{InvalidAdapterMessage};
  return *adapter;
}

}  // namespace

void WithRoute(const InputPtr& input, const OutputPtr& output,
               const std::function<void(const IMA_OID& adapter, const RouteText& route)>& steps) {
  ReportingImaFailures(*output, [&] {
    const RouteText route = ReadRoute(*input);
    steps(AdapterOf(*input), route);
  });
}

IMA_OID FindPortal(const IMA_OID& adapter, const std::string& nic) {
  const ImaList portals(OperationNotSupportedMessage, IMA_TSR_GetNetworkPortalOidList, adapter);
  const auto portal =
      FindIma(portals, IMA_GetNetworkPortalProperties, OperationNotSupportedMessage,
              [&nic](const IMA_NETWORK_PORTAL_PROPERTIES& properties) {
                const auto logical =
                    ReadIma(IMA_TSR_GetLnpProperties, properties.associatedLnp, OperationNotSupportedMessage);
                return IsInterface(logical.name, nic);
              });
  if (!portal) throw ImaFailure{"Unable to find network portal."};
  return *portal;
}

}  // namespace TessaroCli::IscsiNamespace

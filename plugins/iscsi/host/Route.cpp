#include "host/Route.h"

#include <cstdio>
#include <cstdlib>

namespace TessaroCli::IscsiNamespace {
namespace {

/// The first number in @p text, 0 where there is none. What stands behind it does not count.
long NumberIn(const std::string& text) { return std::strtol(text.c_str(), nullptr, 10); }

/// The mask of the first @p prefixLength bits of 32.
std::string NetmaskText(long prefixLength) {
  const unsigned mask = prefixLength == 0 ? 0 : 0xffffffffU << (32 - prefixLength);
  char text[sizeof "255.255.255.255"];
  std::snprintf(text, sizeof text, "%u.%u.%u.%u", mask >> 24, mask >> 16 & 0xff, mask >> 8 & 0xff,
                mask & 0xff);
  return text;
}

/// Splits "network/prefix length", or "default", into destination and netmask. False for any other text.
bool DeriveNetmask(RouteText& route) {
  static constexpr char kAny[] = "0.0.0.0";
  if (route.destination == "default") {
    route.destination = route.netmask = kAny;
    return true;
  }
  const std::size_t slash = route.destination.find('/');
  if (slash == std::string::npos) return false;
  const long prefixLength = NumberIn(route.destination.substr(slash + 1));
  if (prefixLength < 0 || prefixLength > 32) return false;
  route.netmask = NetmaskText(prefixLength);
  route.destination.resize(slash);
  return true;
}

}  // namespace

std::optional<RouteText> ReadRoute(const Plinth::CallSpec::Input& input, const OutputPtr& output) {
  RouteText route{.adapter = input.GetString("adapter"),
                  .destination = input.GetString("destination"),
                  .netmask = {},
                  .gateway = input.GetString("gateway"),
                  .nic = input.GetString("nic")};
  if (!input.HasParameter("destination") || !input.HasParameter("gateway")) {
    output->ReportError(
        "Please input at least destination and gateway parameter together.e.g. \"default 192.168.1.1\"");
    return std::nullopt;
  }
  if (input.HasParameter("netmask")) {
    route.netmask = input.GetString("netmask");
  } else if (!DeriveNetmask(route)) {
    output->ReportError(InvalidAddressMessage);
    return std::nullopt;
  }
  if (input.HasParameter("metric")) {
    route.metric = static_cast<IMA_UINT32>(NumberIn(input.GetString("metric")));
  }
  return route;
}

std::optional<IMA_OID> FindRouteAdapter(const std::string& name, const OutputPtr& output) {
  const ImaList adapters(InvalidAdapterMessage, IMA_GetLhbaOidList);
  const auto adapter = IscsiUtil::FindLogicalAdapter(adapters, name, InvalidAdapterMessage);
  if (!adapter) output->ReportError(InvalidAdapterMessage);
  return adapter;
}

std::optional<IMA_OID> FindPortal(const IMA_OID& adapter, const std::string& nic, const OutputPtr& output) {
  const ImaList portals(OperationNotSupportedMessage, IMA_TSR_GetNetworkPortalOidList, adapter);
  const auto portal =
      FindIma(portals, IMA_GetNetworkPortalProperties, OperationNotSupportedMessage,
              [&nic](const IMA_NETWORK_PORTAL_PROPERTIES& properties) {
                const auto logical =
                    ReadIma(IMA_TSR_GetLnpProperties, properties.associatedLnp, OperationNotSupportedMessage);
                return IsInterface(logical.name, nic);
              });
  if (!portal) output->ReportError("Unable to find network portal.");
  return portal;
}

}  // namespace TessaroCli::IscsiNamespace

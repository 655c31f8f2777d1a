#include <cstring>

#include "UnregisteredCommands.h"
#include "host/Route.h"

namespace TessaroCli::IscsiNamespace {
namespace {

/// Compares the first 20 bytes.
bool IsAddress(const IMA_IP_ADDRESS& address, const std::string& text) {
  return std::strncmp(AddressText(address).c_str(), text.c_str(), 20) == 0;
}

bool IsRoute(const IMA_TSR_ROUTE_PROPERTIES& properties, const RouteText& route) {
  return IsAddress(properties.destination, route.destination) &&
         IsAddress(properties.netmask, route.netmask) && IsAddress(properties.gateway, route.gateway) &&
         properties.metric == route.metric && IsInterface(properties.interfaceName, route.nic);
}

}  // namespace

constexpr Declaration RouteRemove::kDeclaration{
    .description = "Remove a route entry for iSCSI adapter.",
    .type = kOperation,
    .options = kRouteOptions,
    .result = SuccessResult(),
};

boost::shared_ptr<RouteRemove> RouteRemove::New() { return CommandFrame::New(); }

void RouteRemove::ExecuteInternal(InputPtr input, OutputPtr output) {
  const auto wanted = ReadRoute(*input, output);
  if (!wanted) return;
  ReportingImaFailures(*output, [&] {
    const auto adapter = FindRouteAdapter(wanted->adapter, output);
    if (!adapter) return;
    const ImaList routes(OperationNotSupportedMessage, IMA_TSR_GetRouteOidList, *adapter);
    const auto route =
        FindIma(routes, IMA_TSR_GetRouteProperties, OperationNotSupportedMessage,
                [&](const IMA_TSR_ROUTE_PROPERTIES& properties) { return IsRoute(properties, *wanted); });
    if (!route) return output->ReportError("Unable to find route.");
    const auto portal = FindPortal(*adapter, wanted->nic, output);
    if (!portal) return;
    CheckIma(IMA_TSR_DisassociateRoute(*adapter, *route, *portal), "Disassociate route failed.");
    CheckIma(IMA_TSR_RemoveRoute(*route), "Remove route failed.");
    PostSuccess(output);
  });
}

}  // namespace TessaroCli::IscsiNamespace

#include "UnregisteredCommands.h"
#include "host/Route.h"

namespace TessaroCli::IscsiNamespace {
namespace {

/// Sets @p address to the one in @p text; false, with @p failure reported, where it is none.
bool ReadAddress(const std::string& text, const char* failure, const OutputPtr& output,
                 IMA_IP_ADDRESS& address) {
  const IMA_IP_ADDRESS* const read = IscsiTools::GetImaIpAddressFromString(text.c_str());
  if (read == nullptr) {
    output->ReportError(failure);
    return false;
  }
  address = *read;
  return true;
}

/// The record of the entry; nothing where an address of it is none, which is then reported.
std::optional<IMA_TSR_ROUTE_PROPERTIES> RecordOf(const RouteText& route, const OutputPtr& output) {
  IMA_TSR_ROUTE_PROPERTIES record{};
  if (!ReadAddress(route.destination, "Unable to parse destination IP address.", output,
                   record.destination) ||
      !ReadAddress(route.netmask, "Unable to parse netmask IP address.", output, record.netmask) ||
      !ReadAddress(route.gateway, "Unable to parse gateway IP address.", output, record.gateway)) {
    return std::nullopt;
  }
  record.metric = route.metric;
  route.nic.copy(record.interfaceName, sizeof record.interfaceName);
  return record;
}

}  // namespace

constexpr Declaration RouteAdd::kDeclaration{
    .description = "Add a route entry for iSCSI adapter.",
    .type = kOperation,
    .options = kRouteOptions,
    .result = SuccessResult(),
};

boost::shared_ptr<RouteAdd> RouteAdd::New() { return CommandFrame::New(); }

void RouteAdd::ExecuteInternal(InputPtr input, OutputPtr output) {
  const auto route = ReadRoute(*input, output);
  if (!route) return;
  ReportingImaFailures(*output, [&] {
    const auto adapter = FindRouteAdapter(route->adapter, output);
    if (!adapter) return;
    const auto portal = FindPortal(*adapter, route->nic, output);
    if (!portal) return;
    const auto record = RecordOf(*route, output);
    if (!record) return;
    IMA_OID added{};
    CheckIma(IMA_TSR_AddRoute(*adapter, *record, &added), "Add route failed.");
    if (IMA_TSR_AssociateRoute(*adapter, added, *portal) == IMA_STATUS_SUCCESS) return PostSuccess(output);
    // An entry without a portal must not stay.
    output->ReportError("Associate route failed.");
    CheckIma(IMA_TSR_RemoveRoute(added), "Remove route failed.");
  });
}

}  // namespace TessaroCli::IscsiNamespace

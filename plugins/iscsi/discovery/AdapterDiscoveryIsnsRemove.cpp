#include "UnregisteredCommands.h"
#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    IsnsAddress("The iSCSI iSNS discovery address: <ip/dns>. Required only for static discovery method."),
    IsnsMethod(),
};

}  // namespace

constexpr Declaration AdapterDiscoveryIsnsRemove::kDeclaration{
    .description = "Remove iSNS discovery address",
    .type = kOperation,
    .options = kOptions,
    .result = SuccessResult(),
};

boost::shared_ptr<AdapterDiscoveryIsnsRemove> AdapterDiscoveryIsnsRemove::New() {
  return CommandFrame::New();
}

void AdapterDiscoveryIsnsRemove::ExecuteInternal(InputPtr input, OutputPtr output) {
  const std::string method = input->GetString("method");
  const std::string address = input->GetString("address");
  const auto server = ServerNamed(method, address, "Failed to remove iSNS discovery address..", output);
  if (!server) return;
  WithAdapter(input, output, ReportingReasonThen("Unable to remove iSNS discovery address."),
              [&](iScsiInterface& adapter) {
                adapter.RemoveIsnsConfig(*server);
                PostSuccess(output);
              });
}

}  // namespace TessaroCli::IscsiNamespace

#include "UnregisteredCommands.h"
#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    IsnsAddress("The iSNS discovery address: <ip/dns>. Required only for static discovery method."),
    IsnsMethod(),
};

}  // namespace

constexpr Declaration AdapterDiscoveryIsnsAdd::kDeclaration{
    .description = "Add iSNS discovery address",
    .type = kOperation,
    .options = kOptions,
    .result = SuccessResult(),
};

boost::shared_ptr<AdapterDiscoveryIsnsAdd> AdapterDiscoveryIsnsAdd::New() { return CommandFrame::New(); }

void AdapterDiscoveryIsnsAdd::ExecuteInternal(InputPtr input, OutputPtr output) {
  constexpr char kFailure[] = "Unable to add iSNS discovery address.";
  const std::string method = input->GetString("method");
  const std::string address = input->GetString("address");
  const auto server = ServerNamed(method, address, kFailure, output);
  if (!server) return;
  WithAdapter(input, output, ReportingReasonThen(kFailure), [&](iScsiInterface& adapter) {
    adapter.AddIsnsConfig(*server);
    PostSuccess(output);
  });
}

}  // namespace TessaroCli::IscsiNamespace

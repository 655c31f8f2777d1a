#include "UnregisteredCommands.h"
#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr char kFailure[] = "Failed to get iSNS parameter configuration.";

constexpr Option kOptions[] = {
    AdapterOption(),
    IsnsAddress("The iSNS discovery address: <ip/dns>. Required for only static discovery method."),
    IsnsMethod(),
};

}  // namespace

constexpr Declaration AdapterDiscoveryIsnsParamGet::kDeclaration{
    .description = "Get parameters on iSNS discovery address",
    .type = kFetcher,
    .formatter = "table",
    .formatterSettings = {FieldsFrom(1, kParm, "fields")},
    .options = kOptions,
    .result = ListResult(),
};

boost::shared_ptr<AdapterDiscoveryIsnsParamGet> AdapterDiscoveryIsnsParamGet::New() {
  return CommandFrame::New();
}

StructPtr AdapterDiscoveryIsnsParamGet::GetOutputStructure() const { return IscsiTools::ParmStructure(); }

void AdapterDiscoveryIsnsParamGet::ExecuteInternal(InputPtr input, OutputPtr output) {
  const std::string method = input->GetString("method");
  const std::string address = input->GetString("address");
  const auto server = ServerNamed(method, address, kFailure, output);
  if (!server) return;
  WithAdapter(input, output, ReportingReasonThen(kFailure),
              [&](iScsiInterface& adapter) { ShowIsnsParm(adapter.GetIsnsParms(*server), output); });
}

}  // namespace TessaroCli::IscsiNamespace

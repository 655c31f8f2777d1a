#include "UnregisteredCommands.h"
#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr char kFailure[] = "Failed to get iSNS parameter configuration.";

constexpr Option kOptions[] = {
    AdapterOption(),
};

}  // namespace

constexpr Declaration AdapterIsnsParamGet::kDeclaration{
    .description = "Get the iSNS parameters for the iSCSI Host Bus Adapter.",
    .type = kFetcher,
    .formatter = "table",
    .formatterSettings = {FieldsFrom(1, kParm, "fields")},
    .options = kOptions,
    .result = ListResult(),
};

boost::shared_ptr<AdapterIsnsParamGet> AdapterIsnsParamGet::New() { return CommandFrame::New(); }

StructPtr AdapterIsnsParamGet::GetOutputStructure() const { return IscsiTools::ParmStructure(); }

void AdapterIsnsParamGet::ExecuteInternal(InputPtr input, OutputPtr output) {
  WithAdapter(input, output, ReportingReasonThen(kFailure),
              [&](iScsiInterface& adapter) { ShowIsnsParm(adapter.GetAdapterIsnsParms(), output); });
}

}  // namespace TessaroCli::IscsiNamespace

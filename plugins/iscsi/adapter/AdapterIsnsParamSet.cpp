#include "UnregisteredCommands.h"
#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    StringOption("key", 'k', "The iSNS parameter key.").Required(),
    StringOption("value", 'v', "The iSNS parameter value."),
    FlagOption("default", 'D', "Resetting iSNS parameter setting to default."),
};

constexpr char kFailure[] =
    "Unable to set iSNS parameters. Please make sure parameter input is settable and within MAX/MIN "
    "range (integer takes numbers, bool takes [true/false,yes/no,y/n]).";

}  // namespace

constexpr Declaration AdapterIsnsParamSet::kDeclaration{
    .description = "Set the iSNS parameter for the iSCSI Host Bus Adapter.",
    .type = kOperation,
    .options = kOptions,
    .result = SuccessResult(),
};

boost::shared_ptr<AdapterIsnsParamSet> AdapterIsnsParamSet::New() { return CommandFrame::New(); }

void AdapterIsnsParamSet::ExecuteInternal(InputPtr input, OutputPtr output) {
  if (CountGiven(input, {"value", "default"}) != 1) return output->ReportError(kValueOrDefaultMessage);
  if (!KeyAndValueAreSound(input, output)) return;
  WithAdapter(input, output, ReportingReasonThen(kFailure), [&](iScsiInterface& adapter) {
    const std::string key = input->GetString("key");
    iSnsParms parms = adapter.GetAdapterIsnsParms();
    if (!IscsiTools::IsIsnsParmSettable(key, parms)) return output->ReportError(NotSettableText(key));
    if (input->HasParameter("value")) {
      IscsiTools::IsnsParmSet(key, input->GetString("value"), parms);
    } else {
      if (!input->GetFlag("default")) return output->ReportError(InvalidDefaultUseMessage);
      IscsiTools::IsnsParmDefault(key, parms);
    }
    IscsiTools::ProcessStatus(&adapter, adapter.SetAdapterIsnsParms(parms), output);
    PostSuccess(output);
  });
}

}  // namespace TessaroCli::IscsiNamespace

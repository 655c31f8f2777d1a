#include "UnregisteredCommands.h"
#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    IsnsAddress("The iSNS discovery address: <ip/dns>. Required only for static method."),
    IsnsMethod("The iSNS discovery method: <static/dhcp/slp>. Only static supported"),
    StringOption("key", 'k', "The iSNS parameter key").Required(),
    StringOption("value", 'v', "The iSNS parameter value"),
    FlagOption("inherit", 'I', "Inheriting iSNS parameter setting from parent."),
    FlagOption("default", 'D', "Resetting iSNS parameter setting to default."),
};

constexpr char kFailure[] =
    "Unable to set isns parameters. Please make sure parameter input is settable and within MAX/MIN "
    "range (integer takes numbers, bool takes [true/false,yes/no,y/n]).";

}  // namespace

constexpr Declaration AdapterDiscoveryIsnsParamSet::kDeclaration{
    .description = "Set iSNS discovery parameters.",
    .type = kOperation,
    .options = kOptions,
    .result = SuccessResult(),
};

boost::shared_ptr<AdapterDiscoveryIsnsParamSet> AdapterDiscoveryIsnsParamSet::New() {
  return CommandFrame::New();
}

void AdapterDiscoveryIsnsParamSet::ExecuteInternal(InputPtr input, OutputPtr output) {
  const std::string method = input->GetString("method");
  const std::string address = input->GetString("address");
  if (CountGiven(input, {"value", "inherit", "default"}) != 1) return output->ReportError(kOnlyOneMessage);
  const auto server = ServerNamed(method, address, "Unnable to set isns parameters.", output);
  if (!server) return;
  if (!KeyAndValueAreSound(input, output)) return;
  WithAdapter(input, output, ReportingReasonThen(kFailure), [&](iScsiInterface& adapter) {
    const std::string key = input->GetString("key");
    iSnsParms parms = adapter.GetIsnsParms(*server);
    if (!IscsiTools::IsIsnsParmSettable(key, parms)) return output->ReportError(NotSettableText(key));
    if (input->HasParameter("value")) {
      IscsiTools::IsnsParmSet(key, input->GetString("value"), parms);
      adapter.SetIsnsParms(*server, parms);
    } else if (input->HasParameter("inherit")) {
      if (input->GetFlag("inherit")) {
        IscsiTools::IsnsParmInherit(key, parms);
        adapter.SetIsnsParms(*server, parms);
      }
    } else {
      if (!input->GetFlag("default")) return output->ReportError(InvalidDefaultUseMessage);
      IscsiTools::IsnsParmDefault(key, parms);
      adapter.SetIsnsParms(*server, parms);
    }
    PostSuccess(output);
  });
}

}  // namespace TessaroCli::IscsiNamespace

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Storage::iScsiCapabilities;

struct NetworkParm {
  const char* name;
  bool iScsiCapabilities::*settable;
  iScsiInterface::iScsiStatus (*set)(iScsiInterface& adapter, int value);
};

constexpr NetworkParm kParms[] = {
    {"MTU", &iScsiCapabilities::mtuSettable,
     [](iScsiInterface& adapter, int value) { return adapter.SetMtu(value); }},
    {"ArpRedirect", &iScsiCapabilities::arpRedirectSettable,
     [](iScsiInterface& adapter, int value) { return adapter.SetArpRedirect(value != 0); }},
};
constexpr const char* kParmNames[] = {kParms[0].name, kParms[1].name};

constexpr Option kOptions[] = {
    AdapterOption(),
    StringOption("nic", 'n', "The physical network portal name: <phynic>"),
    StringOption("option", 'o', "The network parameter option. Supported options are %ENUM%.")
        .Required()
        .OneOf(kParmNames),
    IntegerOption("value", 'v',
                  "Input value for a Physical Network Portal option (use 0/1 for bool, and number for int)")
        .Required(),
};

}  // namespace

class PhysicalNetworkPortalParamSet : public CommandFrame<PhysicalNetworkPortalParamSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set network parameter on a Physical Network Portal",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, Reporting("Failed to set parameter for physical network portal."),
                [&](iScsiInterface& adapter) {
                  const std::string name = input->GetString("option");
                  const int value = input->GetInt("value");
                  if (adapter.IsSoftwareOrDependent()) {
                    return output->ReportError(
                        "Physical Network Portal parameter set is not supported on software or dependent "
                        "hardware iSCSI adapter.");
                  }
                  const iScsiCapabilities capabilities = adapter.GetCapabilities();
                  for (const NetworkParm& parm : kParms) {
                    if (name != parm.name) continue;
                    if (!(capabilities.*parm.settable)) {
                      return output->ReportError("Option " + name + " is not settable");
                    }
                    IscsiTools::ProcessStatus(&adapter, parm.set(adapter, value), output);
                  }
                  PostSuccess(output);
                });
  }
};

template NodePtr Make<PhysicalNetworkPortalParamSet>();

}  // namespace TessaroCli::IscsiNamespace

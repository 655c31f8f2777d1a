#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Storage::iScsiCapabilities;

struct Option {
  const char* name;
  bool iScsiCapabilities::*settable;
  iScsiInterface::iScsiStatus (*set)(iScsiInterface& adapter, int value);
};

constexpr Option kOptions[] = {
    {"MTU", &iScsiCapabilities::mtuSettable,
     [](iScsiInterface& adapter, int value) { return adapter.SetMtu(value); }},
    {"ArpRedirect", &iScsiCapabilities::arpRedirectSettable,
     [](iScsiInterface& adapter, int value) { return adapter.SetArpRedirect(value != 0); }},
};
constexpr const char* kOptionNames[] = {kOptions[0].name, kOptions[1].name};

constexpr Parameter kParameters[] = {
    Adapter(),
    String("nic", 'n', "The physical network portal name: <phynic>"),
    String("option", 'o', "The network parameter option. Supported options are %ENUM%.")
        .Required()
        .OneOf(kOptionNames),
    Integer("value", 'v',
            "Input value for a Physical Network Portal option (use 0/1 for bool, and number for int)")
        .Required(),
};

}  // namespace

class PhysicalNetworkPortalParamSet : public CommandFrame<PhysicalNetworkPortalParamSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set network parameter on a Physical Network Portal",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, {"Failed to set parameter for physical network portal."},
                [&](iScsiInterface& adapter) {
                  const std::string name = input->GetString("option");
                  const int value = input->GetInt("value");
                  if (adapter.IsSoftwareOrDependent()) {
                    return output->ReportError(
                        "Physical Network Portal parameter set is not supported on software or dependent "
                        "hardware iSCSI adapter.");
                  }
                  const iScsiCapabilities capabilities = adapter.GetCapabilities();
                  for (const Option& option : kOptions) {
                    if (name != option.name) continue;
                    if (!(capabilities.*option.settable)) {
                      return output->ReportError("Option " + name + " is not settable");
                    }
                    IscsiTools::ProcessStatus(&adapter, option.set(adapter, value), output);
                  }
                  PostSuccess(output);
                });
  }
};

template NodePtr Make<PhysicalNetworkPortalParamSet>();

}  // namespace TessaroCli::IscsiNamespace

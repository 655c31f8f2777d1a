#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {
    Adapter(),
    IsnsAddress("The iSNS discovery address: <ip/dns>. Required only for static method."),
    IsnsMethod("The iSNS discovery method: <static/dhcp/slp>. Only static supported"),
    String("key", 'k', "The iSNS parameter key").Required(),
    String("value", 'v', "The iSNS parameter value"),
    Flag("inherit", 'I', "Inheriting iSNS parameter setting from parent."),
    Flag("default", 'D', "Resetting iSNS parameter setting to default."),
};

constexpr IsnsPlace kServerPlace{
    .inherits = true,
    .failureText =
        "Unable to set isns parameters. Please make sure parameter input is settable and within MAX/MIN "
        "range (integer takes numbers, bool takes [true/false,yes/no,y/n]).",
    .get = [](iScsiInterface& adapter, const iSnsConfig& server) { return adapter.GetIsnsParms(server); },
    .set = [](iScsiInterface& adapter, const iSnsConfig& server, const iSnsParms& parms,
              const OutputPtr&) { adapter.SetIsnsParms(server, parms); },
};

}  // namespace

class __attribute__((visibility("default"))) AdapterDiscoveryIsnsParamSet
    : public CommandFrame<AdapterDiscoveryIsnsParamSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set iSNS discovery parameters.",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    if (CountIsnsSources(input, kServerPlace.inherits) != 1) {
      return output->ReportError("Only one options value, inherit, default can be used at once.");
    }
    const auto server = ServerFrom(input, output, "Unnable to set isns parameters.");
    if (server) SetIsnsParm(kServerPlace, *server, input, output);
  }
};

template __attribute__((visibility("default"))) NodePtr Make<AdapterDiscoveryIsnsParamSet>();

}  // namespace TessaroCli::IscsiNamespace

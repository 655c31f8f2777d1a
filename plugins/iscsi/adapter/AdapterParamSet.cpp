#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    StringOption("key", 'k', "The iSCSI initiator parameter key.").Required(),
    StringOption("value", 'v', "The iSCSI initiator parameter value."),
    FlagOption("default", 'D', "Resetting iSCSI parameter setting to default."),
};

}  // namespace

class AdapterParamSet : public CommandFrame<AdapterParamSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set the iSCSI parameter for the iSCSI Host Bus Adapter.",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    if (CountGiven(input, {"value", "default"}) != 1) return output->ReportError(kValueOrDefaultMessage);
    if (!KeyAndValueAreSound(input, output)) return;
    WithAdapter(input, output, Reporting(kParmSetFailure), [&](iScsiInterface& adapter) {
      const std::string key = input->GetString("key");
      const iScsiCapabilities capabilities = adapter.GetCapabilities();
      iScsiParms parms = adapter.GetAdapterParms();
      if (!IscsiTools::IsParmSettable(key, parms, capabilities.adapterHeaderDigestSupported,
                                      capabilities.adapterDataDigestSupported)) {
        return output->ReportError(NotSettableText(key));
      }
      const auto actOn = [&](iScsiInterface::iScsiStatus status) {
        IscsiTools::ProcessStatus(&adapter, status, output);
      };
      // A digest, which does not stand in the record, is stored ahead of it.
      if (input->HasParameter("value")) {
        const std::string value = input->GetString("value");
        IscsiTools::ParmSet(key, value, parms);
        if (key == "HeaderDigest") actOn(adapter.SetHeaderDigest(IscsiTools::GetDigestFromString(value)));
        if (key == "DataDigest") actOn(adapter.SetDataDigest(IscsiTools::GetDigestFromString(value)));
      } else {
        if (!input->GetFlag("default")) return output->ReportError(InvalidDefaultUseMessage);
        IscsiTools::ParmDefault(key, parms);
        if (key == "HeaderDigest") actOn(adapter.SetHeaderDigest(iScsiDigestType::Prohibited));
        if (key == "DataDigest") actOn(adapter.SetDataDigest(iScsiDigestType::Prohibited));
      }
      actOn(adapter.SetAdapterParms(parms));
      PostSuccess(output);
    });
  }
};

template NodePtr Make<AdapterParamSet>();

}  // namespace TessaroCli::IscsiNamespace

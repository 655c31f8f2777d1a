#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {Adapter(), SendTargetAddress()};

}  // namespace

class AdapterDiscoverySendtargetParamGet : public CommandFrame<AdapterDiscoverySendtargetParamGet> {
 public:
  static constexpr Declaration kDeclaration =
      ParmListing("Get iSCSI parameter on a sendtarget address", kParameters);

  StructPtr GetOutputStructure() const { return IscsiTools::ParmStructure(); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ShowParms(kSendTargetLevel, input, output);
  }
};

template NodePtr Make<AdapterDiscoverySendtargetParamGet>();

}  // namespace TessaroCli::IscsiNamespace

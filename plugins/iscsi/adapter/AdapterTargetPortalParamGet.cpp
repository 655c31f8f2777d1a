#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {Adapter(), TargetName(), PortalAddress()};

}  // namespace

class AdapterTargetPortalParamGet : public CommandFrame<AdapterTargetPortalParamGet> {
 public:
  static constexpr Declaration kDeclaration = ParmListing("Get iSCSI parameter on a target", kParameters);

  StructPtr GetOutputStructure() const { return IscsiTools::ParmStructure(); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override { ShowParms(kTargetLevel, input, output); }
};

template NodePtr Make<AdapterTargetPortalParamGet>();

}  // namespace TessaroCli::IscsiNamespace

#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {Adapter()};

}  // namespace

class AdapterParamGet : public CommandFrame<AdapterParamGet> {
 public:
  static constexpr Declaration kDeclaration =
      ParmListing("Get the iSCSI parameters for the iSCSI Host Bus Adapter.", kParameters);

  StructPtr GetOutputStructure() const { return IscsiTools::ParmStructure(); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override { ShowParms(kAdapterLevel, input, output); }
};

template NodePtr Make<AdapterParamGet>();

}  // namespace TessaroCli::IscsiNamespace

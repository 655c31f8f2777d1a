#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {AdapterOption(), TargetName(), PortalAddress()};

}  // namespace

class AdapterTargetPortalParamGet : public CommandFrame<AdapterTargetPortalParamGet> {
 public:
  static constexpr Declaration kDeclaration = ParmListing("Get iSCSI parameter on a target", kOptions);

  StructPtr GetOutputStructure() const { return IscsiTools::ParmStructure(); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, Reporting(kParmGetFailure), [&](iScsiInterface& adapter) {
      const std::string name = input->GetString("name");
      const std::string address = input->GetString("address");
      const std::vector<StaticTarget> targets = TargetsNamed(adapter, name, address);
      const iScsiCapabilities capabilities = adapter.GetCapabilities();
      const ListPtr list = NewList(GetOutputStructure());
      for (const StaticTarget& target : targets) {
        const std::string id = target.name + ',' + IscsiTools::GetStringFromTargetAddress(target.address);
        const iScsiParms parms = adapter.GetTargetParms(target);
        const iScsiDigestType header = adapter.GetTargetHeaderDigest(target);
        const iScsiDigestType data = adapter.GetTargetDataDigest(target);
        IscsiTools::ParmFill(id, list, parms, header, data, capabilities.targetLevelHeaderDigestSupported,
                             capabilities.targetLevelDataDigestSupported);
      }
      Post(output, list);
    });
  }
};

template NodePtr Make<AdapterTargetPortalParamGet>();

}  // namespace TessaroCli::IscsiNamespace

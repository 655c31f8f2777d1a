#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {AdapterOption(), SendTargetAddress()};

}  // namespace

class AdapterDiscoverySendtargetParamGet : public CommandFrame<AdapterDiscoverySendtargetParamGet> {
 public:
  static constexpr Declaration kDeclaration =
      ParmListing("Get iSCSI parameter on a sendtarget address", kOptions);

  StructPtr GetOutputStructure() const { return IscsiTools::ParmStructure(); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, Reporting(kParmGetFailure), [&](iScsiInterface& adapter) {
      const TargetAddress address = IscsiTools::GetTargetAddressFromString(input->GetString("address"));
      const ListPtr list = NewList(GetOutputStructure());
      const iScsiCapabilities capabilities = adapter.GetCapabilities();
      const iScsiParms parms = adapter.GetSendTargetParms(address);
      const iScsiDigestType header = adapter.GetSendTargetHeaderDigest(address);
      const iScsiDigestType data = adapter.GetSendTargetDataDigest(address);
      IscsiTools::ParmFill(IscsiTools::GetStringFromTargetAddress(address), list, parms, header, data,
                           capabilities.targetLevelHeaderDigestSupported,
                           capabilities.targetLevelDataDigestSupported);
      Post(output, list);
    });
  }
};

template NodePtr Make<AdapterDiscoverySendtargetParamGet>();

}  // namespace TessaroCli::IscsiNamespace

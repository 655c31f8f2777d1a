#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {AdapterOption()};

}  // namespace

class AdapterParamGet : public CommandFrame<AdapterParamGet> {
 public:
  static constexpr Declaration kDeclaration =
      ParmListing("Get the iSCSI parameters for the iSCSI Host Bus Adapter.", kOptions);

  StructPtr GetOutputStructure() const { return IscsiTools::ParmStructure(); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, Reporting(kParmGetFailure), [&](iScsiInterface& adapter) {
      const ListPtr list = NewList(GetOutputStructure());
      const iScsiCapabilities capabilities = adapter.GetCapabilities();
      const iScsiParms parms = adapter.GetAdapterParms();
      const iScsiDigestType header = adapter.GetHeaderDigest();
      const iScsiDigestType data = adapter.GetDataDigest();
      IscsiTools::ParmFill(adapter.GetName(), list, parms, header, data,
                           capabilities.adapterHeaderDigestSupported,
                           capabilities.adapterDataDigestSupported);
      Post(output, list);
    });
  }
};

template NodePtr Make<AdapterParamGet>();

}  // namespace TessaroCli::IscsiNamespace

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

class IbftBootImport : public CommandFrame<IbftBootImport> {
 public:
  static constexpr Declaration kDeclaration{
      .description =
          "Import iSCSI target configuration from iBFT to Halden iSCSI initiators. The boot target "
          "recorded in iBFT is added to all the eligible 'dependent' iSCSI adapters.",
      .type = kOperation,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr, OutputPtr output) override {
    CoreCtl::Storage::StorageInfoImpl storage;
    Guarded(output, Reporting("Unable to import IBFT Boot table."), [&] {
      storage.MountiScsiBootLun(true, true);
      PostSuccess(output);
    });
  }
};

template NodePtr Make<IbftBootImport>();

}  // namespace TessaroCli::IscsiNamespace

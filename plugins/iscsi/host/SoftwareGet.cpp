#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

class SoftwareGet : public CommandFrame<SoftwareGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Software iSCSI information.",
      .type = kFetcher,
      .formatter = "simple",
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr, OutputPtr output) override {
    CoreCtl::Storage::StorageInfoImpl storage;
    Guarded(output, Reporting("Unable to get Software iSCSI information."),
            [&] { Post(output, Plinth::MetaObj::MetaBool::New(storage.HasSoftwareiScsiEnabled())); });
  }
};

template NodePtr Make<SoftwareGet>();

}  // namespace TessaroCli::IscsiNamespace

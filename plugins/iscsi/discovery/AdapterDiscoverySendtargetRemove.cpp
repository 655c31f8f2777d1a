#include "discovery/AddressList.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {Adapter(), ListedSendTarget()};

}  // namespace

class AdapterDiscoverySendtargetRemove : public CommandFrame<AdapterDiscoverySendtargetRemove> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Remove a sendtarget address",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ChangeList(&iScsiInterface::RemoveSendTargetAddress, "Failed to remove sendtarget.", input, output);
  }
};

template NodePtr Make<AdapterDiscoverySendtargetRemove>();

}  // namespace TessaroCli::IscsiNamespace

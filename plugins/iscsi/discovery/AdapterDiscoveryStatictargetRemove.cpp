#include "discovery/AddressList.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {Adapter(), ListedTargetName(), ListedTarget()};

}  // namespace

class AdapterDiscoveryStatictargetRemove : public CommandFrame<AdapterDiscoveryStatictargetRemove> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Remove a static target",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ChangeList(&iScsiInterface::RemoveStaticTarget, "Failed to remove static target.", input, output);
  }
};

template NodePtr Make<AdapterDiscoveryStatictargetRemove>();

}  // namespace TessaroCli::IscsiNamespace

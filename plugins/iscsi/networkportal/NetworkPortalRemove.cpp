#include "networkportal/Binding.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr char kFailure[] = "Unable to unbind iscsi port.";

constexpr Parameter kParameters[] = {
    Adapter(),
    BoundHostnic(),
    Boolean("force", 'f',
            "The force flag (force removal of iSCSI hostnic when sessions are active using it)"),
};

}  // namespace

class NetworkPortalRemove : public CommandFrame<NetworkPortalRemove> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Remove a network portal for iSCSI adapter",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ChangeBinding(input, output, {&iScsiInterface::UnbindHostnic, {kFailure, kFailure}});
  }
};

template NodePtr Make<NetworkPortalRemove>();

}  // namespace TessaroCli::IscsiNamespace

#include "networkportal/Binding.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {
    Adapter(),
    BoundHostnic(),
    Boolean("force", 'f',
            "The force flag (force add of iSCSI hostnic even it's not compatible for iscsi multipathing)"),
};

}  // namespace

class NetworkPortalAdd : public CommandFrame<NetworkPortalAdd> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Add a network portal for iSCSI adapter",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ChangeBinding(input, output,
                  {&iScsiInterface::BindHostnic,
                   {"Unable to bind iscsi port. [force = 0]\n", "Unable to bind iscsi port. [force = 1]\n"}});
  }
};

template NodePtr Make<NetworkPortalAdd>();

}  // namespace TessaroCli::IscsiNamespace

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {Adapter()};

}  // namespace

class AdapterDiscoveryRediscover : public CommandFrame<AdapterDiscoveryRediscover> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Do the iSCSI Discovery for the iSCSI Host Bus Adapter.",
      .type = kOperation,
      .formatter = "simple",
      .parameters = kParameters,
      .result = Text("RediscoveryStatus"),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, {"Unable to discover targets."}, [&](iScsiInterface& adapter) {
      adapter.Rediscover();
      PostText(output, "Rediscovery started");
    });
  }
};

template NodePtr Make<AdapterDiscoveryRediscover>();

}  // namespace TessaroCli::IscsiNamespace

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {AdapterOption()};

}  // namespace

class AdapterDiscoveryRediscover : public CommandFrame<AdapterDiscoveryRediscover> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Do the iSCSI Discovery for the iSCSI Host Bus Adapter.",
      .type = kOperation,
      .formatter = "simple",
      .options = kOptions,
      .result = TextResult("RediscoveryStatus"),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, Reporting("Unable to discover targets."), [&](iScsiInterface& adapter) {
      adapter.Rediscover();
      PostText(output, "Rediscovery started");
    });
  }
};

template NodePtr Make<AdapterDiscoveryRediscover>();

}  // namespace TessaroCli::IscsiNamespace

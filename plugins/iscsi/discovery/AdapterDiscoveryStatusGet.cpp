#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {AdapterOption()};

}  // namespace

class AdapterDiscoveryStatusGet : public CommandFrame<AdapterDiscoveryStatusGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get the iSCSI adapter discovery status for the iSCSI Host Bus Adapter.",
      .type = kFetcher,
      .formatter = "simple",
      .options = kOptions,
      .result = TextResult("DiscoveryStatus"),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, Reporting("Unable to get discovery status."), [&](iScsiInterface& adapter) {
      PostText(output, IscsiTools::GetStringFromDiscoveryStatus(adapter.GetDiscoveryStatus()));
    });
  }
};

template NodePtr Make<AdapterDiscoveryStatusGet>();

}  // namespace TessaroCli::IscsiNamespace

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NetworkProperties = NodeCtl::Storage::iScsiNetworkProperties;

struct Portal {
  std::string adapter;
  NetworkProperties properties;
};

/// True where the number is stated at all.
template <std::int32_t NetworkProperties::*member>
constexpr auto IsStated = [](const Portal& portal) { return portal.properties.*member != -1; };

constexpr Column<Portal> kColumns[] = {
    {"IscsiAdapter", [](const Portal& portal) { return portal.adapter; }},
    {"IPv6 Supported", Property<&NetworkProperties::ipv6Supported>},
    {"IPv6 Enabled", Property<&NetworkProperties::ipv6Enabled>},
    {"Gateway6", [](const Portal& portal) { return portal.properties.gateway6.GetStringAddress(); }},
    {"Use IPv6 Router Advertisement", Property<&NetworkProperties::useRouterAdvertisement>},
    {"Use Link Local Auto Configuration", Property<&NetworkProperties::useLinkLocalAutoConfiguration>},
    {"Use Dhcpv6", Property<&NetworkProperties::useDhcpv6>},
    {"IPv6 Prefix Length Valid", IsStated<&NetworkProperties::ipv6PrefixLength>},
    {"IPv6 Prefix Length", Property<&NetworkProperties::ipv6PrefixLength>},
    {"IPv6 Max Static Address Supported Valid", IsStated<&NetworkProperties::ipv6MaxStaticAddresses>},
    {"IPv6 Max Static Address Supported", Property<&NetworkProperties::ipv6MaxStaticAddresses>},
};
constexpr auto kPortal = StructureOf<kColumns>("NetworkPortal");

constexpr Option kOptions[] = {AdapterOption()};

}  // namespace

class NetworkPortalIpv6configGet : public CommandFrame<NetworkPortalIpv6configGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get iSCSI network portal ipv6 configuration",
      .formatter = "simple",
      .formatterSettings = {Setting("header:NetworkPortal", "%IscsiAdapter%"),
                            FieldsFrom(1, kPortal, "fields:NetworkPortal")},
      .options = kOptions,
      .result = StructureResult(kPortal),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, ReportingThenReason("Failed to get IP configuration for network portal."),
                [&](iScsiInterface& adapter) {
                  const auto network = adapter.GetNetworkProperties();
                  Post(output, NewRow(kPortal, {input->GetString("adapter"), network}));
                });
  }
};

template NodePtr Make<NetworkPortalIpv6configGet>();

}  // namespace TessaroCli::IscsiNamespace

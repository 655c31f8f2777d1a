#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NetworkProperties = NodeCtl::Storage::iScsiNetworkProperties;

struct Portal {
  std::string adapter;
  NetworkProperties network;
};

template <auto NetworkProperties::*member>
constexpr auto Member = [](const Portal& portal) { return portal.network.*member; };

/// True where the number is stated at all.
template <std::int32_t NetworkProperties::*member>
constexpr auto IsStated = [](const Portal& portal) { return portal.network.*member != -1; };

constexpr Column<Portal> kColumns[] = {
    {"IscsiAdapter", [](const Portal& portal) { return portal.adapter; }},
    {"IPv6 Supported", Member<&NetworkProperties::ipv6Supported>},
    {"IPv6 Enabled", Member<&NetworkProperties::ipv6Enabled>},
    {"Gateway6", [](const Portal& portal) { return portal.network.gateway6.GetStringAddress(); }},
    {"Use IPv6 Router Advertisement", Member<&NetworkProperties::useRouterAdvertisement>},
    {"Use Link Local Auto Configuration", Member<&NetworkProperties::useLinkLocalAutoConfiguration>},
    {"Use Dhcpv6", Member<&NetworkProperties::useDhcpv6>},
    {"IPv6 Prefix Length Valid", IsStated<&NetworkProperties::ipv6PrefixLength>},
    {"IPv6 Prefix Length", Member<&NetworkProperties::ipv6PrefixLength>},
    {"IPv6 Max Static Address Supported Valid", IsStated<&NetworkProperties::ipv6MaxStaticAddresses>},
    {"IPv6 Max Static Address Supported", Member<&NetworkProperties::ipv6MaxStaticAddresses>},
};
constexpr Structure kPortal = StructureOf<kColumns>("NetworkPortal");

constexpr Parameter kParameters[] = {Adapter()};

}  // namespace

class NetworkPortalIpv6configGet : public CommandFrame<NetworkPortalIpv6configGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get iSCSI network portal ipv6 configuration",
      .formatter = "simple",
      .formatterParameters = {Setting("header:NetworkPortal", "%IscsiAdapter%"),
                              FieldsFrom(1, "fields:NetworkPortal")},
      .parameters = kParameters,
      .result = One(kPortal),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output,
                {"Failed to get IP configuration for network portal.", FailureReport::Reason::Last},
                [&](iScsiInterface& adapter) {
                  const auto network = adapter.GetNetworkProperties();
                  Post(output, NewRow(kPortal, kColumns, {input->GetString("adapter"), network}));
                });
  }
};

template NodePtr Make<NetworkPortalIpv6configGet>();

}  // namespace TessaroCli::IscsiNamespace

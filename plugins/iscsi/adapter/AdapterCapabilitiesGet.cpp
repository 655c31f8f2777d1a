#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using Capabilities = NodeCtl::Storage::iScsiCapabilities;

struct Shown {
  iScsiInterface& adapter;
  Capabilities capabilities;
};

template <bool Capabilities::*member>
constexpr auto Has = [](const Shown& shown) { return shown.capabilities.*member; };

constexpr Column<Shown> kColumns[] = {
    {"ID", [](const Shown& shown) { return shown.adapter.GetName(); }},
    {"ISnS Settable", Has<&Capabilities::iSnsSettable>},
    {"SLP Settable", Has<&Capabilities::slpSettable>},
    {"Static Discovery Settable", Has<&Capabilities::staticDiscoverySettable>},
    {"Sendtarget Discovery Settable", Has<&Capabilities::sendTargetDiscoverySettable>},
    {"Authorization Method Settable", Has<&Capabilities::authorizationMethodSettable>},
    {"CHAP Authorization Supported", Has<&Capabilities::chapAuthorizationSupported>},
    {"SRP Authorization Supported", Has<&Capabilities::srpAuthorizationSupported>},
    {"KRB5 Authorization Supported", Has<&Capabilities::krb5AuthorizationSupported>},
    {"SPKM1 Authorization Supported", Has<&Capabilities::spkm1AuthorizationSupported>},
    {"SPKM2 Authorization Supported", Has<&Capabilities::spkm2AuthorizationSupported>},
    {"Mutual Authentication Supported", Has<&Capabilities::mutualAuthenticationSupported>},
    {"Target Level Authentication Supported", Has<&Capabilities::targetLevelAuthenticationSupported>},
    {"Target Level Mutual Authentication Supported",
     Has<&Capabilities::targetLevelMutualAuthenticationSupported>},
    {"Adapter Header Digest Supported", Has<&Capabilities::adapterHeaderDigestSupported>},
    {"Target Level Header Digest Supported", Has<&Capabilities::targetLevelHeaderDigestSupported>},
    {"Adapter Data Digest Supported", Has<&Capabilities::adapterDataDigestSupported>},
    {"Target Level Data Digest Supported", Has<&Capabilities::targetLevelDataDigestSupported>},
    {"ARP Redirect Settable", Has<&Capabilities::arpRedirectSettable>},
    {"MTU Settable", Has<&Capabilities::mtuSettable>},
    {"Delayed Ack Settable", Has<&Capabilities::delayedAckSettable>},
    {"IPv6 Supported", Has<&Capabilities::ipv6Supported>},
    {"DNS Based Address Supported", Has<&Capabilities::dnsBasedAddressSupported>},
    {"Inheritance Supported", Has<&Capabilities::inheritanceSupported>},
    {"IPv4 Enable Settable", Has<&Capabilities::ipv4EnableSettable>},
    {"IP Configuration Method Settable", Has<&Capabilities::ipConfigurationMethodSettable>},
    {"Subnet Mask Setttable", Has<&Capabilities::subnetMaskSettable>},
    {"Default Gateway Settable", Has<&Capabilities::defaultGatewaySettable>},
    {"IPv6 Enable Settable", Has<&Capabilities::ipv6EnableSettable>},
    {"IPv6 Prefix Length Settable", Has<&Capabilities::ipv6PrefixLengthSettable>},
    {"IPv6 DHCP Configuration Method Settable", Has<&Capabilities::ipv6DhcpConfigurationMethodSettable>},
    {"IPv6 Linklocal Auto Configuration Method Settable",
     Has<&Capabilities::ipv6LinkLocalAutoConfigurationMethodSettable>},
    {"IPv6 Router Advertisement Configuration Method Settable",
     Has<&Capabilities::ipv6RouterAdvertisementConfigurationMethodSettable>},
    {"IPv6 Default Gateway Settable", Has<&Capabilities::ipv6DefaultGatewaySettable>},
    {"Primary DNS Settable", Has<&Capabilities::primaryDnsSettable>},
    {"Secondary DNS Settable", Has<&Capabilities::secondaryDnsSettable>},
    {"Name And Alias Settable", Has<&Capabilities::nameAndAliasSettable>},
};
constexpr Structure kCapabilities = StructureOf<kColumns>("AdapterCapabilities");

constexpr Parameter kParameters[] = {Adapter()};

}  // namespace

class AdapterCapabilitiesGet : public CommandFrame<AdapterCapabilitiesGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List the iSCSI details for the iSCSI Host Bus Adapter.",
      .type = kFetcher,
      .formatter = "simple",
      .formatterParameters = {Setting("header:AdapterCapabilities", "%ID%"), FieldsFrom(1, "fields")},
      .parameters = kParameters,
      .result = ListOf(kCapabilities),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kCapabilities); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, {"Unable to get adapter properties."}, [&](iScsiInterface& adapter) {
      const ListPtr list = NewList(kCapabilities);
      list->Append(NewRow(kCapabilities, kColumns, {adapter, adapter.GetCapabilities()}));
      Post(output, list);
    });
  }
};

template NodePtr Make<AdapterCapabilitiesGet>();

}  // namespace TessaroCli::IscsiNamespace

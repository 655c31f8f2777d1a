#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using Capabilities = NodeCtl::Storage::iScsiCapabilities;

struct Shown {
  iScsiInterface& adapter;
  Capabilities properties;
};

constexpr Column<Shown> kColumns[] = {
    {"ID", [](const Shown& shown) { return shown.adapter.GetName(); }},
    {"ISnS Settable", Property<&Capabilities::iSnsSettable>},
    {"SLP Settable", Property<&Capabilities::slpSettable>},
    {"Static Discovery Settable", Property<&Capabilities::staticDiscoverySettable>},
    {"Sendtarget Discovery Settable", Property<&Capabilities::sendTargetDiscoverySettable>},
    {"Authorization Method Settable", Property<&Capabilities::authorizationMethodSettable>},
    {"CHAP Authorization Supported", Property<&Capabilities::chapAuthorizationSupported>},
    {"SRP Authorization Supported", Property<&Capabilities::srpAuthorizationSupported>},
    {"KRB5 Authorization Supported", Property<&Capabilities::krb5AuthorizationSupported>},
    {"SPKM1 Authorization Supported", Property<&Capabilities::spkm1AuthorizationSupported>},
    {"SPKM2 Authorization Supported", Property<&Capabilities::spkm2AuthorizationSupported>},
    {"Mutual Authentication Supported", Property<&Capabilities::mutualAuthenticationSupported>},
    {"Target Level Authentication Supported", Property<&Capabilities::targetLevelAuthenticationSupported>},
    {"Target Level Mutual Authentication Supported",
     Property<&Capabilities::targetLevelMutualAuthenticationSupported>},
    {"Adapter Header Digest Supported", Property<&Capabilities::adapterHeaderDigestSupported>},
    {"Target Level Header Digest Supported", Property<&Capabilities::targetLevelHeaderDigestSupported>},
    {"Adapter Data Digest Supported", Property<&Capabilities::adapterDataDigestSupported>},
    {"Target Level Data Digest Supported", Property<&Capabilities::targetLevelDataDigestSupported>},
    {"ARP Redirect Settable", Property<&Capabilities::arpRedirectSettable>},
    {"MTU Settable", Property<&Capabilities::mtuSettable>},
    {"Delayed Ack Settable", Property<&Capabilities::delayedAckSettable>},
    {"IPv6 Supported", Property<&Capabilities::ipv6Supported>},
    {"DNS Based Address Supported", Property<&Capabilities::dnsBasedAddressSupported>},
    {"Inheritance Supported", Property<&Capabilities::inheritanceSupported>},
    {"IPv4 Enable Settable", Property<&Capabilities::ipv4EnableSettable>},
    {"IP Configuration Method Settable", Property<&Capabilities::ipConfigurationMethodSettable>},
    {"Subnet Mask Setttable", Property<&Capabilities::subnetMaskSettable>},
    {"Default Gateway Settable", Property<&Capabilities::defaultGatewaySettable>},
    {"IPv6 Enable Settable", Property<&Capabilities::ipv6EnableSettable>},
    {"IPv6 Prefix Length Settable", Property<&Capabilities::ipv6PrefixLengthSettable>},
    {"IPv6 DHCP Configuration Method Settable", Property<&Capabilities::ipv6DhcpConfigurationMethodSettable>},
    {"IPv6 Linklocal Auto Configuration Method Settable",
     Property<&Capabilities::ipv6LinkLocalAutoConfigurationMethodSettable>},
    {"IPv6 Router Advertisement Configuration Method Settable",
     Property<&Capabilities::ipv6RouterAdvertisementConfigurationMethodSettable>},
    {"IPv6 Default Gateway Settable", Property<&Capabilities::ipv6DefaultGatewaySettable>},
    {"Primary DNS Settable", Property<&Capabilities::primaryDnsSettable>},
    {"Secondary DNS Settable", Property<&Capabilities::secondaryDnsSettable>},
    {"Name And Alias Settable", Property<&Capabilities::nameAndAliasSettable>},
};
constexpr auto kCapabilities = StructureOf<kColumns>("AdapterCapabilities");

constexpr Option kOptions[] = {AdapterOption()};

}  // namespace

class AdapterCapabilitiesGet : public CommandFrame<AdapterCapabilitiesGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List the iSCSI details for the iSCSI Host Bus Adapter.",
      .type = kFetcher,
      .formatter = "simple",
      .formatterSettings = {Setting("header:AdapterCapabilities", "%ID%"),
                            FieldsFrom(1, kCapabilities, "fields")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kCapabilities); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, Reporting("Unable to get adapter properties."), [&](iScsiInterface& adapter) {
      const ListPtr list = NewList(GetOutputStructure());
      list->Append(NewRow(kCapabilities, {adapter, adapter.GetCapabilities()}));
      Post(output, list);
    });
  }
};

template NodePtr Make<AdapterCapabilitiesGet>();

}  // namespace TessaroCli::IscsiNamespace

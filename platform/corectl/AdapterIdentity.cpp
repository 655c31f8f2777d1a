#include "corectl/Adapter.h"
#include "corectl/Members.h"
#include "host/Formats.h"
#include "host/Restart.h"

namespace corectl {

namespace {

constexpr std::size_t kAliasLimit = 255;

std::size_t liveInterfaces = 0;

constexpr Member<iScsiPhysicalHbaProperties> kPropertyMembers[] = {
    {"vendor", &iScsiPhysicalHbaProperties::vendor},
    {"model", &iScsiPhysicalHbaProperties::model},
    {"description", &iScsiPhysicalHbaProperties::description},
    {"serialNumber", &iScsiPhysicalHbaProperties::serialNumber},
    {"hardwareVersion", &iScsiPhysicalHbaProperties::hardwareVersion},
    {"asicVersion", &iScsiPhysicalHbaProperties::asicVersion},
    {"firmwareVersion", &iScsiPhysicalHbaProperties::firmwareVersion},
    {"optionRomVersion", &iScsiPhysicalHbaProperties::optionRomVersion},
    {"driverName", &iScsiPhysicalHbaProperties::driverName},
    {"driverVersion", &iScsiPhysicalHbaProperties::driverVersion},
    {"tcpProtocolSupported", &iScsiPhysicalHbaProperties::tcpProtocolSupported},
    {"bidirectionalTransfersSupported", &iScsiPhysicalHbaProperties::bidirectionalTransfersSupported},
    {"maximumCdbLength", &iScsiPhysicalHbaProperties::maximumCdbLength},
    {"canBeNic", &iScsiPhysicalHbaProperties::canBeNic},
    {"isNic", &iScsiPhysicalHbaProperties::isNic},
    {"isInitiator", &iScsiPhysicalHbaProperties::isInitiator},
    {"isTarget", &iScsiPhysicalHbaProperties::isTarget},
    {"usingTcpOffloadEngine", &iScsiPhysicalHbaProperties::usingTcpOffloadEngine},
    {"usingIscsiOffloadEngine", &iScsiPhysicalHbaProperties::usingIscsiOffloadEngine},
};

constexpr Member<iScsiCapabilities> kCapabilityMembers[] = {
    {"ISnS Settable", &iScsiCapabilities::iSnsSettable},
    {"SLP Settable", &iScsiCapabilities::slpSettable},
    {"Static Discovery Settable", &iScsiCapabilities::staticDiscoverySettable},
    {"Sendtarget Discovery Settable", &iScsiCapabilities::sendTargetDiscoverySettable},
    {"Authorization Method Settable", &iScsiCapabilities::authorizationMethodSettable},
    {"CHAP Authorization Supported", &iScsiCapabilities::chapAuthorizationSupported},
    {"SRP Authorization Supported", &iScsiCapabilities::srpAuthorizationSupported},
    {"KRB5 Authorization Supported", &iScsiCapabilities::krb5AuthorizationSupported},
    {"SPKM1 Authorization Supported", &iScsiCapabilities::spkm1AuthorizationSupported},
    {"SPKM2 Authorization Supported", &iScsiCapabilities::spkm2AuthorizationSupported},
    {"Mutual Authentication Supported", &iScsiCapabilities::mutualAuthenticationSupported},
    {"Target Level Authentication Supported", &iScsiCapabilities::targetLevelAuthenticationSupported},
    {"Target Level Mutual Authentication Supported",
     &iScsiCapabilities::targetLevelMutualAuthenticationSupported},
    {"Adapter Header Digest Supported", &iScsiCapabilities::adapterHeaderDigestSupported},
    {"Target Level Header Digest Supported", &iScsiCapabilities::targetLevelHeaderDigestSupported},
    {"Adapter Data Digest Supported", &iScsiCapabilities::adapterDataDigestSupported},
    {"Target Level Data Digest Supported", &iScsiCapabilities::targetLevelDataDigestSupported},
    {"ARP Redirect Settable", &iScsiCapabilities::arpRedirectSettable},
    {"MTU Settable", &iScsiCapabilities::mtuSettable},
    {"Delayed Ack Settable", &iScsiCapabilities::delayedAckSettable},
    {"IPv6 Supported", &iScsiCapabilities::ipv6Supported},
    {"DNS Based Address Supported", &iScsiCapabilities::dnsBasedAddressSupported},
    {"Inheritance Supported", &iScsiCapabilities::inheritanceSupported},
    {"IPv4 Enable Settable", &iScsiCapabilities::ipv4EnableSettable},
    {"IP Configuration Method Settable", &iScsiCapabilities::ipConfigurationMethodSettable},
    {"Subnet Mask Setttable", &iScsiCapabilities::subnetMaskSettable},
    {"Default Gateway Settable", &iScsiCapabilities::defaultGatewaySettable},
    {"IPv6 Enable Settable", &iScsiCapabilities::ipv6EnableSettable},
    {"IPv6 Prefix Length Settable", &iScsiCapabilities::ipv6PrefixLengthSettable},
    {"IPv6 DHCP Configuration Method Settable", &iScsiCapabilities::ipv6DhcpConfigurationMethodSettable},
    {"IPv6 Linklocal Auto Configuration Method Settable",
     &iScsiCapabilities::ipv6LinkLocalAutoConfigurationMethodSettable},
    {"IPv6 Router Advertisement Configuration Method Settable",
     &iScsiCapabilities::ipv6RouterAdvertisementConfigurationMethodSettable},
    {"IPv6 Default Gateway Settable", &iScsiCapabilities::ipv6DefaultGatewaySettable},
    {"Primary DNS Settable", &iScsiCapabilities::primaryDnsSettable},
    {"Secondary DNS Settable", &iScsiCapabilities::secondaryDnsSettable},
    {"Name And Alias Settable", &iScsiCapabilities::nameAndAliasSettable},
};

/// Refuses a new name or alias where the adapter has none to set.
void RequireNameSettable(const host::Object& adapter) {
  if (adapter.record.GetBool("capabilities/Name And Alias Settable")) return;
  throw host::Error(host::Error::Kind::NotSettable, "The name and the alias of the adapter " +
                                                        host::Quoted(adapter.name) + " are not settable.");
}

}  // namespace

#ifdef HCLI_CHECKED
std::size_t LiveInterfaces() { return liveInterfaces; }
#endif

AdapterRef::AdapterRef(std::string name) : name_(std::move(name)) { ++liveInterfaces; }
AdapterRef::~AdapterRef() { --liveInterfaces; }

std::string AdapterRef::ReadText(host::Operation operation, const char* path) const {
  return Read(operation,
              [path](host::Tree&, const host::Object& adapter) { return adapter.record.GetString(path); });
}

host::Object AdapterRef::Find(host::Tree& tree) const {
  std::optional<host::Object> adapter = tree.Find(host::kRoot, host::Kind::Adapter, name_);
  if (!adapter || !IsPresent(tree, *adapter)) {
    throw host::Error(host::Error::Kind::NotFound,
                      "There is no adapter " + host::Quoted(name_) + " any more.");
  }
  return *std::move(adapter);
}

std::string OtherAdapter::GetName() { return ref_.ReadText("GetName", "name"); }
std::string OtherAdapter::GetAdapterUid() { return ref_.ReadText("GetAdapterUid", "uid"); }
std::string OtherAdapter::GetDriverName() { return ref_.ReadText("GetDriverName", "driver"); }

std::string Adapter::GetName() { return ref_.ReadText("GetName", "name"); }
std::string Adapter::GetAdapterUid() { return ref_.ReadText("GetAdapterUid", "uid"); }
std::string Adapter::GetDriverName() { return ref_.ReadText("GetDriverName", "driver"); }

bool Adapter::IsSoftwareOrDependent() {
  return ref_.Read("IsSoftwareOrDependent", [](host::Tree&, const host::Object& adapter) {
    return adapter.record.GetString("kind") != "independent";
  });
}

void Adapter::ResetAdapter() {
  ref_.Change("ResetAdapter", {},
              [](host::Tree& tree, const host::Object& adapter) { host::Reset(tree, adapter); });
  host::CallLog::Current().WasReset(ref_.Name());
}

iScsiCapabilities Adapter::GetCapabilities() {
  return ref_.Read("GetCapabilities", [](host::Tree&, const host::Object& adapter) {
    iScsiCapabilities capabilities;
    Fill(capabilities, kCapabilityMembers, adapter.record.GetRecord("capabilities"));
    return capabilities;
  });
}

iScsiPhysicalHbaProperties Adapter::GetPhysicalHbaProperties() {
  return ref_.Read("GetPhysicalHbaProperties", [](host::Tree&, const host::Object& adapter) {
    iScsiPhysicalHbaProperties properties;
    Fill(properties, kPropertyMembers, adapter.record.GetRecord("properties"));
    return properties;
  });
}

std::string Adapter::GetInitiatorName() { return ref_.ReadText("GetInitiatorName", "initiatorName"); }

Adapter::iScsiStatus Adapter::SetInitiatorName(const std::string& name) {
  return ChangeWithStatus("SetInitiatorName", {name}, [&](host::Tree& tree, host::Object& adapter) {
    RequireNameSettable(adapter);
    RequireInitiatorName(name);
    if (adapter.record.GetString("kind") == "software") HeedNameFile(adapter);
    return ConfigureName(tree, adapter, name, host::EffectOf(adapter.record, Setting::Identity));
  });
}

std::string Adapter::GetInitiatorAlias() { return ref_.ReadText("GetInitiatorAlias", "alias"); }

Adapter::iScsiStatus Adapter::SetInitiatorAlias(const std::string& alias) {
  return Configure("SetInitiatorAlias", {alias}, Setting::Identity, [&](host::Object& adapter) {
    RequireNameSettable(adapter);
    if (alias.size() > kAliasLimit) {
      throw host::Error(host::Error::Kind::OutOfRange, "The alias has " + std::to_string(alias.size()) +
                                                           " bytes, and at most 255 are allowed.");
    }
    adapter.record.Set("alias", alias);
  });
}

Adapter::iScsiAdapterState Adapter::GetAdapterState() {
  return ref_.Read("GetAdapterState", [](host::Tree&, const host::Object& adapter) {
    return static_cast<iScsiAdapterState>(adapter.record.GetInt("state"));
  });
}

}  // namespace corectl

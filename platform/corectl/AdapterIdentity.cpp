#include "corectl/Adapter.h"
#include "host/Formats.h"
#include "host/Restart.h"

namespace corectl {

namespace {

constexpr std::size_t kAliasLimit = 255;

std::size_t liveInterfaces = 0;

constexpr std::pair<const char*, std::string iScsiPhysicalHbaProperties::*> kPropertyTexts[] = {
    {"properties/vendor", &iScsiPhysicalHbaProperties::vendor},
    {"properties/model", &iScsiPhysicalHbaProperties::model},
    {"properties/description", &iScsiPhysicalHbaProperties::description},
    {"properties/serialNumber", &iScsiPhysicalHbaProperties::serialNumber},
    {"properties/hardwareVersion", &iScsiPhysicalHbaProperties::hardwareVersion},
    {"properties/asicVersion", &iScsiPhysicalHbaProperties::asicVersion},
    {"properties/firmwareVersion", &iScsiPhysicalHbaProperties::firmwareVersion},
    {"properties/optionRomVersion", &iScsiPhysicalHbaProperties::optionRomVersion},
    {"properties/driverName", &iScsiPhysicalHbaProperties::driverName},
    {"properties/driverVersion", &iScsiPhysicalHbaProperties::driverVersion},
};

constexpr std::pair<const char*, ExtendedBool iScsiPhysicalHbaProperties::*> kPropertyBools[] = {
    {"properties/bidirectionalTransfersSupported",
     &iScsiPhysicalHbaProperties::bidirectionalTransfersSupported},
    {"properties/canBeNic", &iScsiPhysicalHbaProperties::canBeNic},
    {"properties/isNic", &iScsiPhysicalHbaProperties::isNic},
    {"properties/isInitiator", &iScsiPhysicalHbaProperties::isInitiator},
    {"properties/isTarget", &iScsiPhysicalHbaProperties::isTarget},
    {"properties/usingTcpOffloadEngine", &iScsiPhysicalHbaProperties::usingTcpOffloadEngine},
    {"properties/usingIscsiOffloadEngine", &iScsiPhysicalHbaProperties::usingIscsiOffloadEngine},
};

/// In the order of host::kCapabilities.
constexpr bool iScsiCapabilities::*kCapabilityMembers[] = {
    &iScsiCapabilities::iSnsSettable,
    &iScsiCapabilities::slpSettable,
    &iScsiCapabilities::staticDiscoverySettable,
    &iScsiCapabilities::sendTargetDiscoverySettable,
    &iScsiCapabilities::authorizationMethodSettable,
    &iScsiCapabilities::chapAuthorizationSupported,
    &iScsiCapabilities::srpAuthorizationSupported,
    &iScsiCapabilities::krb5AuthorizationSupported,
    &iScsiCapabilities::spkm1AuthorizationSupported,
    &iScsiCapabilities::spkm2AuthorizationSupported,
    &iScsiCapabilities::mutualAuthenticationSupported,
    &iScsiCapabilities::targetLevelAuthenticationSupported,
    &iScsiCapabilities::targetLevelMutualAuthenticationSupported,
    &iScsiCapabilities::adapterHeaderDigestSupported,
    &iScsiCapabilities::targetLevelHeaderDigestSupported,
    &iScsiCapabilities::adapterDataDigestSupported,
    &iScsiCapabilities::targetLevelDataDigestSupported,
    &iScsiCapabilities::arpRedirectSettable,
    &iScsiCapabilities::mtuSettable,
    &iScsiCapabilities::delayedAckSettable,
    &iScsiCapabilities::ipv6Supported,
    &iScsiCapabilities::dnsBasedAddressSupported,
    &iScsiCapabilities::inheritanceSupported,
    &iScsiCapabilities::ipv4EnableSettable,
    &iScsiCapabilities::ipConfigurationMethodSettable,
    &iScsiCapabilities::subnetMaskSettable,
    &iScsiCapabilities::defaultGatewaySettable,
    &iScsiCapabilities::ipv6EnableSettable,
    &iScsiCapabilities::ipv6PrefixLengthSettable,
    &iScsiCapabilities::ipv6DhcpConfigurationMethodSettable,
    &iScsiCapabilities::ipv6LinkLocalAutoConfigurationMethodSettable,
    &iScsiCapabilities::ipv6RouterAdvertisementConfigurationMethodSettable,
    &iScsiCapabilities::ipv6DefaultGatewaySettable,
    &iScsiCapabilities::primaryDnsSettable,
    &iScsiCapabilities::secondaryDnsSettable,
    &iScsiCapabilities::nameAndAliasSettable,
};
static_assert(std::size(kCapabilityMembers) == std::size(host::kCapabilities));

std::string CapabilityPath(std::string_view name) { return "capabilities/" + std::string(name); }

/// Refuses a new name or alias where the adapter has none to set.
void RequireNameSettable(const host::Object& adapter) {
  if (adapter.record.GetBool(CapabilityPath("Name And Alias Settable"))) return;
  throw host::Error(host::Error::Kind::Refused, "The name and the alias of the adapter " +
                                                    host::Quoted(adapter.name) + " are not settable.");
}

}  // namespace

std::size_t LiveInterfaces() { return liveInterfaces; }

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
}

iScsiCapabilities Adapter::GetCapabilities() {
  return ref_.Read("GetCapabilities", [](host::Tree&, const host::Object& adapter) {
    iScsiCapabilities capabilities;
    for (std::size_t i = 0; i < std::size(kCapabilityMembers); ++i) {
      capabilities.*kCapabilityMembers[i] = adapter.record.GetBool(CapabilityPath(host::kCapabilities[i]));
    }
    return capabilities;
  });
}

iScsiPhysicalHbaProperties Adapter::GetPhysicalHbaProperties() {
  return ref_.Read("GetPhysicalHbaProperties", [](host::Tree&, const host::Object& adapter) {
    iScsiPhysicalHbaProperties properties;
    for (const auto& [path, member] : kPropertyTexts) properties.*member = adapter.record.GetString(path);
    for (const auto& [path, member] : kPropertyBools) {
      properties.*member = static_cast<ExtendedBool>(adapter.record.GetWord(path, host::kExtendedBools));
    }
    properties.tcpProtocolSupported = adapter.record.GetBool("properties/tcpProtocolSupported");
    properties.maximumCdbLength = adapter.record.GetInt("properties/maximumCdbLength");
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
      throw host::Error(host::Error::Kind::Refused, "The alias has " + std::to_string(alias.size()) +
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

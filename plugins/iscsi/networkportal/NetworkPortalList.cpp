#include "AdapterWalk.h"
#include "networkportal/Ipv6Text.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NicProperties = NodeCtl::Storage::iScsiNicProperties;

struct Portal {
  const std::string& adapter;
  const NicProperties& nic;
};

template <auto NicProperties::*member>
constexpr auto Member = [](const Portal& portal) {
  const auto& value = portal.nic.*member;
  if constexpr (std::is_same_v<decltype(value), const std::uint32_t&>) {
    return static_cast<long long>(value);
  } else {
    return value;
  }
};

/// From the first port to the first one behind the range.
std::string ReservedPortsText(const NicProperties& nic) {
  return std::to_string(nic.reservedPortFirst) + '~' +
         std::to_string(std::uint64_t{nic.reservedPortFirst} + nic.reservedPortCount);
}

constexpr Column<Portal> kColumns[] = {
    {"Adapter", [](const Portal& portal) { return portal.adapter; }},
    {"Hostnic", Member<&NicProperties::name>},
    {"MAC Address", [](const Portal& portal) { return portal.nic.mac.GetStringAddress(); }},
    {"MAC Address Valid", [](const Portal& portal) { return portal.nic.mac.IsValid(); }},
    {"IPv4", [](const Portal& portal) { return portal.nic.ipConfig.GetIpv4Address().GetStringAddress(); }},
    {"IPv4 Subnet Mask",
     [](const Portal& portal) { return portal.nic.ipConfig.GetIpv4Netmask().GetStringAddress(); }},
    {"IPv6", [](const Portal& portal) { return Ipv6Text(portal.nic.ipConfig); }},
    {"MTU", Member<&NicProperties::mtu>},
    {"Vlan Supported", Member<&NicProperties::vlanSupported>},
    {"Vlan ID", Member<&NicProperties::vlanId>},
    {"Reserved Ports", [](const Portal& portal) { return ReservedPortsText(portal.nic); }},
    {"TOE", Member<&NicProperties::toe>},
    {"TSO", Member<&NicProperties::tso>},
    {"TCP Checksum", Member<&NicProperties::tcpChecksum>},
    {"Link Up", Member<&NicProperties::linkUp>},
    {"Current Speed", Member<&NicProperties::currentSpeed>},
    {"Rx Packets", Member<&NicProperties::rxPackets>},
    {"Tx Packets", Member<&NicProperties::txPackets>},
    {"NIC Driver", Member<&NicProperties::driver>},
    {"NIC Driver Version", Member<&NicProperties::driverVersion>},
    {"NIC Firmware Version", Member<&NicProperties::firmwareVersion>},
    {"Compliant Status",
     [](const Portal& portal) { return IscsiTools::GetStringFromComplianceCode(portal.nic.complianceCode); }},
    {"NonCompliant Message", Member<&NicProperties::nonCompliantMessage>},
    {"NonCompliant Remedy", Member<&NicProperties::nonCompliantRemedy>},
    {"Vswitch", Member<&NicProperties::vswitch>},
    {"PortGroup", Member<&NicProperties::portGroup>},
    {"VswitchUuid", Member<&NicProperties::vswitchUuid>},
    {"PortGroupKey", Member<&NicProperties::portGroupKey>},
    {"PortKey", Member<&NicProperties::portKey>},
    {"Duplex", Member<&NicProperties::duplex>},
    {"Path Status",
     [](const Portal& portal) { return IscsiTools::GetStringFromPathStatus(portal.nic.pathStatus); }},
};
constexpr Structure kPortal = StructureOf<kColumns>("NetworkPortal");

constexpr Parameter kParameters[] = {AdapterFilter()};

}  // namespace

class NetworkPortalList : public CommandFrame<NetworkPortalList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List Network Portal for iSCSI Adapter",
      .type = kFetcher,
      .formatter = "simple",
      .formatterParameters = {Setting("header:NetworkPortal", "%Adapter%"), FieldsFrom(0, "fields")},
      .parameters = kParameters,
      .result = ListOf(kPortal),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kPortal); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ListAdapters(input, output, {"Failed to list network portals."}, kPortal,
                 LacksCall<NicPropertiesNotSupportedMessage>,
                 [](const ListedAdapter& listed, Plinth::MetaObj::MetaList& list) {
                   std::vector<NicProperties> nics;
                   listed.storage.GetiScsiBoundNicListWithPathStatus(listed.name, nics);
                   for (const NicProperties& nic : nics) {
                     list.Append(NewRow(kPortal, kColumns, {listed.name, nic}));
                   }
                 });
  }
};

template NodePtr Make<NetworkPortalList>();

}  // namespace TessaroCli::IscsiNamespace

#include "AdapterWalk.h"
#include "networkportal/Ipv6Text.h"
#include "networkportal/MissingCall.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NicProperties = NodeCtl::Storage::iScsiNicProperties;

struct Portal {
  const std::string& adapter;
  const NicProperties& properties;
};

/// From the first port to the first one behind the range.
std::string ReservedPortsText(const NicProperties& nic) {
  return std::to_string(nic.reservedPortFirst) + '~' +
         std::to_string(std::uint64_t{nic.reservedPortFirst} + nic.reservedPortCount);
}

constexpr Column<Portal> kColumns[] = {
    {"Adapter", [](const Portal& portal) { return portal.adapter; }},
    {"Hostnic", Property<&NicProperties::name>},
    {"MAC Address", [](const Portal& portal) { return portal.properties.mac.GetStringAddress(); }},
    {"MAC Address Valid", [](const Portal& portal) { return portal.properties.mac.IsValid(); }},
    {"IPv4",
     [](const Portal& portal) { return portal.properties.ipConfig.GetIpv4Address().GetStringAddress(); }},
    {"IPv4 Subnet Mask",
     [](const Portal& portal) { return portal.properties.ipConfig.GetIpv4Netmask().GetStringAddress(); }},
    {"IPv6", [](const Portal& portal) { return Ipv6Text(portal.properties.ipConfig); }},
    {"MTU", Property<&NicProperties::mtu>},
    {"Vlan Supported", Property<&NicProperties::vlanSupported>},
    {"Vlan ID", Property<&NicProperties::vlanId>},
    {"Reserved Ports", [](const Portal& portal) { return ReservedPortsText(portal.properties); }},
    {"TOE", Property<&NicProperties::toe>},
    {"TSO", Property<&NicProperties::tso>},
    {"TCP Checksum", Property<&NicProperties::tcpChecksum>},
    {"Link Up", Property<&NicProperties::linkUp>},
    {"Current Speed", Property<&NicProperties::currentSpeed>},
    {"Rx Packets", Property<&NicProperties::rxPackets>},
    {"Tx Packets", Property<&NicProperties::txPackets>},
    {"NIC Driver", Property<&NicProperties::driver>},
    {"NIC Driver Version", Property<&NicProperties::driverVersion>},
    {"NIC Firmware Version", Property<&NicProperties::firmwareVersion>},
    {"Compliant Status",
     [](const Portal& portal) {
       return IscsiTools::GetStringFromComplianceCode(portal.properties.complianceCode);
     }},
    {"NonCompliant Message", Property<&NicProperties::nonCompliantMessage>},
    {"NonCompliant Remedy", Property<&NicProperties::nonCompliantRemedy>},
    {"Vswitch", Property<&NicProperties::vswitch>},
    {"PortGroup", Property<&NicProperties::portGroup>},
    {"VswitchUuid", Property<&NicProperties::vswitchUuid>},
    {"PortGroupKey", Property<&NicProperties::portGroupKey>},
    {"PortKey", Property<&NicProperties::portKey>},
    {"Duplex", Property<&NicProperties::duplex>},
    {"Path Status",
     [](const Portal& portal) { return IscsiTools::GetStringFromPathStatus(portal.properties.pathStatus); }},
};
constexpr auto kPortal = StructureOf<kColumns>("NetworkPortal");

constexpr Option kOptions[] = {AdapterFilter()};

}  // namespace

class NetworkPortalList : public CommandFrame<NetworkPortalList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List Network Portal for iSCSI Adapter",
      .type = kFetcher,
      .formatter = "simple",
      .formatterSettings = {Setting("header:NetworkPortal", "%Adapter%"), FieldsFrom(0, kPortal, "fields")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kPortal); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ListAdapters(input, output, Reporting("Failed to list network portals."), GetOutputStructure(),
                 LacksNicProperties, [](const ListedAdapter& listed, Plinth::MetaObj::MetaList& list) {
                   std::vector<NicProperties> nics;
                   listed.storage.GetiScsiBoundNicListWithPathStatus(listed.name, nics);
                   for (const NicProperties& nic : nics) {
                     list.Append(NewRow(kPortal, {listed.name, nic}));
                   }
                 });
  }
};

template NodePtr Make<NetworkPortalList>();

}  // namespace TessaroCli::IscsiNamespace

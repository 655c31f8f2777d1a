// iscsi networkportal list|add|remove, logicalnetworkportal list, physicalnetworkportal list and param
// get|set.
#include "support/Harness.h"

namespace {

using nlohmann::json;
using testing::ElementsAre;
using Texts = std::vector<std::string>;

constexpr char kHost[] = R"({
  "nics": [
    {"name": "nic1", "mac": "02-00-00-00-00-AB", "ipv4Address": "192.0.2.1", "ipv4Netmask": "255.255.255.0",
     "ipv6Addresses": [{"address": "2001:DB8::1"}, {"address": "fe80::1", "prefixLength": 10, "type": 7}],
     "mtu": 4294967295, "vlanSupported": true, "vlanId": 4000000000, "reservedPortFirst": 100,
     "reservedPortCount": 20, "toe": true, "tcpChecksum": true, "currentSpeed": 400000,
     "rxPackets": 4294967295, "txPackets": 2147483648, "driver": "d", "driverVersion": "dv",
     "firmwareVersion": "fv", "vswitch": "vs", "portGroup": "pg", "vswitchUuid": "vu", "portGroupKey": "pgk",
     "portKey": "pk", "duplex": "full"},
    {"name": "nic2", "complianceCode": -3, "nonCompliantMessage": "two uplinks", "nonCompliantRemedy": "use one",
     "linkUp": false, "reservedPortFirst": 4294967295, "reservedPortCount": 1},
    {"name": "nic3", "complianceCode": 1, "nonCompliantMessage": "No uplink."}],
  "adapters": [
    {"name": "soft", "kind": "software", "networkPortals": [{"nic": "nic1", "pathStatus": 2}, {"nic": "nic2"}],
     "physicalPortals": [{"name": "phy9"}]},
    {"name": "dep", "kind": "dependent"},
    {"name": "ind", "kind": "independent", "capabilities": {"MTU Settable": true, "ARP Redirect Settable": true},
     "logicalPortals": [{"name": "port0", "mac": "02:00:00:00:00:01"}, {"name": "port1", "complianceCode": 1}],
     "physicalPortals": [{"name": "phy0", "mac": "02:00:00:00:00:02", "currentSpeed": 400000, "maxSpeed": 4294967295,
                          "maxFrameSize": 9000}, {"name": "phy1"}]},
    {"name": "bare", "kind": "independent"}]})";

TEST(NetworkPortalList, ShowsAllFieldsInOrderAndWhole) {
  const json rows = Harness(kHost)("iscsi networkportal list").result;
  EXPECT_EQ(rows[0], json::parse(R"({
      "Adapter": "soft", "Hostnic": "nic1", "MAC Address": "02:00:00:00:00:ab", "MAC Address Valid": true,
      "IPv4": "192.0.2.1", "IPv4 Subnet Mask": "255.255.255.0", "IPv6": "2001:db8::1/64 fe80::1/10 ",
      "MTU": 4294967295, "Vlan Supported": true, "Vlan ID": 4000000000, "Reserved Ports": "100~120", "TOE": true,
      "TSO": false, "TCP Checksum": true, "Link Up": true, "Current Speed": 400000, "Rx Packets": 4294967295,
      "Tx Packets": 2147483648, "NIC Driver": "d", "NIC Driver Version": "dv", "NIC Firmware Version": "fv",
      "Compliant Status": "compliant", "NonCompliant Message": "", "NonCompliant Remedy": "", "Vswitch": "vs",
      "PortGroup": "pg", "VswitchUuid": "vu", "PortGroupKey": "pgk", "PortKey": "pk", "Duplex": "full",
      "Path Status": "active"})"));
  EXPECT_EQ(rows[1]["MAC Address Valid"], false);
  EXPECT_EQ(rows[1]["Reserved Ports"], "4294967295~4294967296");
  EXPECT_EQ(rows[1]["NonCompliant Message"], "two uplinks");
  EXPECT_EQ(rows[1]["NonCompliant Remedy"], "use one");
  EXPECT_EQ(rows.size(), 2u);
}

// The three portal lists walk alike and differ in what they pass over.

constexpr char kNoNics[] =
    "iScsiLibException: status(80000001): Not supported; Message= IMA_TSR_GetNicProperties";
constexpr char kNoPortals[] =
    "iScsiLibException: status(80000001): Not supported; Message= IMA_TSR_GetLnpOidList";

struct PortalList {
  std::string command;
  const char* operation;
  const char* passedOver;  // null for every text
  const char* failure;
  const char* names;   // of the portals of all adapters
  const char* others;  // of those but "ind"
};

const PortalList kLists[] = {
    {"networkportal", "GetiScsiBoundNicListWithPathStatus", kNoNics, "Failed to list network portals.",
     "nic1 nic2 ", "nic1 nic2 "},
    {"logicalnetworkportal", "GetLogicalNetworkPortals", kNoPortals,
     "Failed to list logical network portals.", "nic1 nic2 port0 port1 ", "nic1 nic2 "},
    {"physicalnetworkportal", "GetPhysicalNetworkPortals", nullptr,
     "Failed to list physical network portals.", "phy9 phy0 phy1 ", "phy9 "},
};

/// The names of the portals in a list.
std::string Names(const Outcome& run) {
  std::string names;
  for (const json& row : run.result) {
    names += row[row.contains("Hostnic") ? "Hostnic" : "Phynic"].get<std::string>() + ' ';
  }
  return names;
}

Outcome List(const PortalList& list, const std::string& options, const std::string& answer = "") {
  return Harness(WithAnswers(kHost, answer))("iscsi " + list.command + " list " + options);
}

TEST(PortalLists, FilterEndsTheWalk) {
  for (const PortalList& list : kLists) {
    EXPECT_EQ(Names(List(list, "")), list.names);
    EXPECT_EQ(Names(List(list, "-A ''")), list.names);
    const Outcome one = List(list, "-A soft");
    EXPECT_EQ(std::count(one.trace.begin(), one.trace.end(), "GetName(dep) = \"dep\""), 0);
    EXPECT_EQ(List(list, "-A bare").result, json::array());
    EXPECT_EQ(Harness("{}")("iscsi " + list.command + " list").result, json::array());
  }
}

TEST(PortalLists, PassOverWhatTheyMay) {
  for (const PortalList& list : kLists) {
    const bool all = list.passedOver == nullptr;
    const std::string exact = all ? "whatever" : list.passedOver;
    const std::tuple<std::string, std::string, bool> cases[] = {
        {"ind", exact, true},
        {"soft", exact, all},
        {"dep", exact, all},
        {"ind", exact + ".", all},
        {"ind", exact == kNoNics ? kNoPortals : kNoNics, all},
    };
    for (const auto& [adapter, text, passedOver] : cases) {
      const json answer = {
          {"operation", list.operation}, {"adapter", adapter}, {"throw", "NodeCtlException"}, {"text", text}};
      SCOPED_TRACE(answer.dump());
      const Outcome run = List(list, "", answer.dump());
      EXPECT_EQ(run.result.is_array(), passedOver);
      EXPECT_EQ(run.messages, passedOver ? Texts() : Texts{list.failure});
      // The adapter was found, though it shows nothing.
      const Outcome alone = List(list, "-A " + adapter, answer.dump());
      EXPECT_EQ(alone.result, passedOver ? json::array() : json());
      if (passedOver && adapter == "ind") {
        EXPECT_EQ(Names(run), list.others);
      }
    }
  }
}

TEST(LogicalNetworkPortalList, AsksEachPortalForItsCompliance) {
  const json rows = Harness(kHost)("iscsi logicalnetworkportal list").result;
  EXPECT_EQ(rows[2], json::parse(R"({"Adapter": "ind", "Hostnic": "port0", "MAC Address": "02:00:00:00:00:01",
                                     "MAC Address Valid": true, "Compliant": true})"));
  EXPECT_EQ(rows[3]["Compliant"], false);

  // The rows that the adapter had by then stay.
  const std::string second = R"({"operation": "GetNicProperties", "adapter": "ind", "call": 2, "throw":)"
                             R"("NodeCtlException", "text": ")" +
                             std::string(kNoPortals) + "\"}";
  EXPECT_EQ(Names(List(kLists[1], "", second)), "nic1 nic2 port0 ");
}

TEST(PhysicalNetworkPortalList, ShowsSpeedsWhole) {
  EXPECT_EQ(Harness(kHost)("iscsi physicalnetworkportal list -A ind").result[0],
            json::parse(R"({"Adapter": "ind", "Phynic": "phy0", "MAC Address": "02:00:00:00:00:02",
                            "MAC Address Valid": true, "Current Speed": 400000, "Max Speed": 4294967295,
                            "Max Frame Size": 9000})"));
}

TEST(NetworkPortalBinding, ChecksReportsAndStores) {
  // The message, null for success, and the last call.
  const std::tuple<const char*, const char*, const char*> cases[] = {
      {"add -A none -n ''", "Invalid networkportal input.", ""},
      {"remove -A none -n ''", "Invalid networkportal input.", ""},
      {"add -A dep -n nic1", nullptr, R"(BindHostnic(dep, "nic1", false) = ok)"},
      {"add -A dep -n nic1 -f true", "Unable to bind iscsi port. [force = 1]\n",
       R"(BindHostnic(dep, "nic1", true) ! NodeCtlException: The NIC "nic1" is bound to the adapter "dep" already.)"},
      {"add -A dep -n nic3 -f false", "Unable to bind iscsi port. [force = 0]\n",
       R"(BindHostnic(dep, "nic3", false) ! NodeCtlException: The NIC "nic3" is not compliant: No uplink.)"},
      {"add -A dep -n nic3 -f true", nullptr, R"(BindHostnic(dep, "nic3", true) = ok)"},
      {"add -A dep -n nic9", "Unable to bind iscsi port. [force = 0]\n",
       R"(BindHostnic(dep, "nic9", false) ! NodeCtlException: The host has no NIC "nic9".)"},
      {"add -A ind -n nic1", "Unable to bind iscsi port. [force = 0]\n",
       R"(BindHostnic(ind, "nic1", false) ! NodeCtlException: The adapter "ind" has ports of its own, and takes no host NIC.)"},
      {"remove -A soft -n nic1", "Unable to unbind iscsi port.",
       R"(UnbindHostnic(soft, "nic1", false) ! NodeCtlException: Active sessions use the NIC "nic1".)"},
      {"remove -A soft -n nic1 -f yes", nullptr, R"(UnbindHostnic(soft, "nic1", true) = ok)"},
      {"remove -A soft -n nic2", nullptr, R"(UnbindHostnic(soft, "nic2", false) = ok)"},
      {"remove -A soft -n nic1 -f yes", "Unable to unbind iscsi port.",
       R"(UnbindHostnic(soft, "nic1", true) ! NodeCtlException: The NIC "nic1" is not bound to the adapter "soft".)"},
  };
  Harness host(kHost);
  for (const auto& [line, message, call] : cases) {
    SCOPED_TRACE(line);
    const Outcome run = host(std::string("iscsi networkportal ") + line);
    EXPECT_EQ(run.messages, message == nullptr ? Texts() : Texts{message});
    EXPECT_EQ(run.result, message == nullptr ? json(true) : json());
    EXPECT_EQ(run.closed, message == nullptr);
    EXPECT_EQ(run.trace.empty() ? "" : run.trace.back(), call);
  }
  EXPECT_EQ(Names(host("iscsi networkportal list -A dep")), "nic1 nic3 ");
  EXPECT_EQ(Names(host("iscsi logicalnetworkportal list -A soft")), "");
}

TEST(PhysicalParam, GetLabelsItsRowsAndReadsTheAdapter) {
  const std::pair<const char*, const char*> cases[] = {
      {"-A ind", "phy0"}, {"-A ind -n other", "other"}, {"-A ind -n ''", ""}, {"-A bare", ""}};
  for (const auto& [options, phynic] : cases) {
    const Outcome run = Harness(kHost)(std::string("iscsi physicalnetworkportal param get ") + options);
    const bool settable = std::string(options).starts_with("-A ind");
    EXPECT_EQ(run.result,
              (json{{{"Phynic", phynic}, {"Option", "MTU"}, {"Value", 1500}, {"Settable", settable}},
                    {{"Phynic", phynic}, {"Option", "ArpRedirect"}, {"Value", 0}, {"Settable", settable}}}))
        << options;
    EXPECT_THAT(run.Calls(),
                ElementsAre("GetScsiInterface", "GetPhysicalNetworkPortals", "IsSoftwareOrDependent",
                            "GetCapabilities", "GetMtu", "GetArpRedirect"));
  }
  EXPECT_THAT(Harness(kHost)("iscsi physicalnetworkportal param get -A dep").messages,
              ElementsAre("Physical Network Portal parameter get is not supported on software or dependent "
                          "hardware iSCSI adapter."));
}

TEST(PhysicalParam, SetJudgesAndStores) {
  constexpr char kFailure[] = "Failed to set parameter for physical network portal.";
  // The message, null for success, and the last call.
  const std::tuple<const char*, const char*, const char*> cases[] = {
      {"-A soft -o MTU -v 9000",
       "Physical Network Portal parameter set is not supported on software or dependent hardware iSCSI "
       "adapter.",
       "IsSoftwareOrDependent"},
      {"-A bare -o MTU -v 9000", "Option MTU is not settable", "GetCapabilities"},
      {"-A bare -o ArpRedirect -v 1", "Option ArpRedirect is not settable", "GetCapabilities"},
      {"-A ind -o MTU -v 575", kFailure, "SetMtu"},
      {"-A ind -o MTU -v 9001", kFailure, "SetMtu"},
      {"-A ind -o MTU -v 576 -n nosuch", nullptr, "ResetAdapter"},
      {"-A ind -o MTU -v 9000", nullptr, "ResetAdapter"},
      {"-A ind -o ArpRedirect -v -1", nullptr, "SetArpRedirect"},
  };
  Harness host(kHost);
  for (const auto& [options, message, lastCall] : cases) {
    SCOPED_TRACE(options);
    const Outcome run = host(std::string("iscsi physicalnetworkportal param set ") + options);
    EXPECT_EQ(run.messages, message == nullptr ? Texts() : Texts{message});
    EXPECT_EQ(run.result, message == nullptr ? json(true) : json());
    EXPECT_EQ(run.Calls().back(), lastCall);
  }
  const json rows = host("iscsi physicalnetworkportal param get -A ind").result;
  EXPECT_EQ(rows[0]["Value"], 9000);
  EXPECT_EQ(rows[1]["Value"], 1);
}

}  // namespace

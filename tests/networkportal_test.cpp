// iscsi networkportal list, logicalnetworkportal list and physicalnetworkportal list: what they pass over.
#include <CoreCtl/Exception.h>
#include <CoreCtl/Storage.h>
#include <ima/ima_tsr.h>

#include <memory>

#include "support/Harness.h"

namespace {

using nlohmann::json;
using Texts = std::vector<std::string>;

constexpr char kHost[] = R"({
  "nics": [
    {"name": "nic1", "mac": "02-00-00-00-00-AB"},
    {"name": "nic2", "complianceCode": -3, "nonCompliantMessage": "two uplinks", "nonCompliantRemedy": "use one",
     "linkUp": false, "reservedPortFirst": 4294967295, "reservedPortCount": 1},
    {"name": "nic3", "complianceCode": 1, "nonCompliantMessage": "No uplink."}],
  "adapters": [
    {"name": "soft", "kind": "software", "networkPortals": [{"nic": "nic1", "pathStatus": 2}, {"nic": "nic2"}],
     "physicalPortals": [{"name": "phy9"}]},
    {"name": "dep", "kind": "dependent"},
    {"name": "ind", "kind": "independent", "capabilities": {"MTU Settable": true, "ARP Redirect Settable": true},
     "logicalPortals": [{"name": "port0", "mac": "02:00:00:00:00:01"}, {"name": "port1"}],
     "physicalPortals": [{"name": "phy0"}, {"name": "phy1"}]},
    {"name": "bare", "kind": "independent"}]})";

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

TEST(LogicalNetworkPortalList, KeepsTheRowsAheadOfAFailure) {
  const std::string second = R"({"operation": "GetNicProperties", "adapter": "ind", "call": 2, "throw":)"
                             R"("NodeCtlException", "text": ")" +
                             std::string(kNoPortals) + "\"}";
  EXPECT_EQ(Names(List(kLists[1], "", second)), "nic1 nic2 port0 ");
}

// What no command asks for, and what one sees of a portal only in part.
TEST(Portals, AreToldByTheLibrariesAsTheListsShowThem) {
  const Harness host(kHost);
  const std::unique_ptr<NodeCtl::Storage::ScsiInterface> adapter(
      CoreCtl::Storage::StorageInfoImpl().GetScsiInterface("ind"));
  NodeCtl::Storage::iScsiNicProperties nic;
  nic.name = "nobody";
  std::vector<NodeCtl::Storage::iScsiNicProperties> nics;
  EXPECT_THAT([&] { dynamic_cast<NodeCtl::Storage::iScsiInterface&>(*adapter).GetNicProperties(nic, nics); },
              testing::ThrowsMessage<NodeCtl::Lib::NodeCtlException>(
                  R"(The adapter "ind" does not know the NIC "nobody".)"));

  IMA_OID_LIST* lhbas = nullptr;
  ASSERT_EQ(IMA_GetLhbaOidList(&lhbas), IMA_STATUS_SUCCESS);
  for (const auto& [lhba, mac] : {std::pair{0, 0xab}, {2, 1}}) {
    IMA_OID_LIST* portals = nullptr;
    ASSERT_EQ(IMA_TSR_GetNetworkPortalOidList(lhbas->oids[lhba], &portals), IMA_STATUS_SUCCESS);
    IMA_NETWORK_PORTAL_PROPERTIES portal{};
    IMA_TSR_LNP_PROPERTIES logical{};
    EXPECT_EQ(IMA_GetNetworkPortalProperties(portals->oids[0], &portal), IMA_STATUS_SUCCESS);
    EXPECT_EQ(IMA_TSR_GetLnpProperties(portal.associatedLnp, &logical), IMA_STATUS_SUCCESS);
    EXPECT_EQ(logical.macAddress[5], mac);
    IMA_FreeMemory(portals);
  }
  IMA_FreeMemory(lhbas);
}

}  // namespace

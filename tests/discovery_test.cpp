// iscsi adapter discovery: the lists of sendtargets and of static targets.
#include "support/Harness.h"

namespace {

using nlohmann::json;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;
using Texts = std::vector<std::string>;

constexpr char kHost[] = R"({"adapters": [
  {"name": "hba0",
   "capabilities": {"Static Discovery Settable": true, "Sendtarget Discovery Settable": true,
                    "IPv6 Supported": true, "DNS Based Address Supported": true},
   "staticTargets": [{"name": "iqn.2026-11.org.example:boot", "host": "192.0.2.7", "boot": true, "portalGroup": 3},
                     {"name": "iqn.2026-11.org.example:found", "host": "192.0.2.7",
                      "sendTarget": {"host": "192.0.2.1"}}]},
  {"name": "bare"}]})";
constexpr char kUnknownAdapter[] = "Invalid adapter specified or unable to get adapter.";

TEST(Discovery, ListsKeepTheirOrderAndShowEachForm) {
  Harness host(kHost);
  const char* added[] = {"storage1", "192.0.2.2", "2001:DB8::1", "[2001:db8::1]:860", "192.0.2.1:860"};
  for (const char* address : added) {
    const Outcome run = host(std::string("iscsi adapter discovery sendtarget add -A hba0 -a ") + address);
    EXPECT_EQ(run.result, true) << address;
    EXPECT_THAT(run.Calls(), ElementsAre("GetScsiInterface", "AddSendTargetAddress"));
  }
  EXPECT_EQ(host("iscsi adapter discovery sendtarget remove -A hba0 -a 192.0.2.2:3260").result, true);
  Texts listed;
  for (const json& row : host("iscsi adapter discovery sendtarget list -A hba0").result) {
    listed.push_back(row["Sendtarget"]);
  }
  EXPECT_THAT(listed,
              ElementsAre("storage1:3260", "[2001:db8::1]:3260", "[2001:db8::1]:860", "192.0.2.1:860"));
  EXPECT_EQ(host("iscsi adapter discovery sendtarget list --adapter=").result.size(), 4u);
  EXPECT_EQ(host("iscsi adapter discovery sendtarget list -A bare").result, json::array());
}

TEST(Discovery, StaticTargetsAreListedThroughTheManagementApi) {
  Harness host(kHost);
  const std::string command = "iscsi adapter discovery statictarget ";
  const std::string place = " -A hba0 -n iqn.2026-11.org.example:t -a ";
  EXPECT_EQ(host(command + "add" + place + "2001:db8::2").result, true);
  EXPECT_EQ(host(command + "add" + place + "name:860").result, true);
  EXPECT_EQ(host(command + "list").result, json::parse(R"([
      {"Adapter": "hba0", "Target Name": "iqn.2026-11.org.example:boot", "Target Address": "192.0.2.7:3260",
       "TPGT": "3", "Boot": "true"},
      {"Adapter": "hba0", "Target Name": "iqn.2026-11.org.example:t", "Target Address": "[2001:db8::2]:3260",
       "TPGT": "na", "Boot": "false"},
      {"Adapter": "hba0", "Target Name": "iqn.2026-11.org.example:t", "Target Address": "name:860",
       "TPGT": "na", "Boot": "false"}])"));
  EXPECT_EQ(host(command + "list --adapter=").result, json::array());
  EXPECT_EQ(host(command + "remove" + place + "2001:db8:0::2").result, true);
  EXPECT_EQ(host(command + "list -A hba0").result.size(), 2u);

  Harness unknown(
      WithAnswers(kHost, R"({"operation": "IMA_TSR_GetInternalConfigData", "imaStatus": 2147483649})"));
  EXPECT_EQ(unknown(command + "list").result[0]["Boot"], "na");
  Harness escaping(WithAnswers(kHost, R"({"operation": "ConvertHostAddress", "throw": "NodeCtlException"})"));
  EXPECT_EQ(escaping(command + "list").status, 4);  // leaks nothing either
}

TEST(Discovery, ChangesOfTheListsTellTheReasonFirst) {
  constexpr std::pair<const char*, const char*> kChanges[] = {
      {"sendtarget add", "Unable to add sendtarget address."},
      {"sendtarget remove", "Failed to remove sendtarget."},
      {"statictarget add -n iqn.2026-11.org.example:boot", "Failed to add static target."},
      {"statictarget remove -n iqn.2026-11.org.example:boot", "Failed to remove static target."},
  };
  constexpr std::pair<const char*, const char*> kAddresses[] = {
      {"192.0.2.8:x", "Invalid port number."},
      {"300.0.0.1", "\"300.0.0.1\" is not an IPv4 address, an IPv6 address or a host name."},
  };
  Harness host(kHost);
  for (const auto& [change, failure] : kChanges) {
    const std::string command = std::string("iscsi adapter discovery ") + change;
    for (const auto& [address, reason] : kAddresses) {
      const Outcome run = host(command + " -A hba0 -a " + address);
      EXPECT_THAT(run.messages, ElementsAre(reason, failure)) << command;
      EXPECT_THAT(run.Calls(), ElementsAre("GetScsiInterface"));
    }
    const bool removes = command.find("remove") != std::string::npos;
    EXPECT_THAT(host(command + " -a '' -A nosuch").messages,
                ElementsAre(removes ? kUnknownAdapter : "Invalid address input."))
        << command;
  }
  const std::string add = "iscsi adapter discovery statictarget add -n '' -A nosuch -a ";
  EXPECT_THAT(host(add + "''").messages, ElementsAre("Invalid address input."));
  EXPECT_THAT(host(add + "192.0.2.1").messages, ElementsAre("Invalid iscsi name input."));
}

TEST(Discovery, TheHostRefusesWhatItHasLacksOrCannotTake) {
  const std::pair<const char*, const char*> cases[] = {
      {"sendtarget remove -A hba0 -a 192.0.2.9", "The adapter hba0 has no sendtarget 192.0.2.9:3260."},
      {"sendtarget add -A bare -a 192.0.2.9",
       "The adapter bare takes no sendtargets: it lacks \"Sendtarget Discovery Settable\"."},
      {"statictarget add -A hba0 -n iqn.2026-11.org.example:boot -a 192.0.2.7",
       "The adapter hba0 has the static target iqn.2026-11.org.example:boot,192.0.2.7:3260 already."},
      {"statictarget add -A hba0 -n nonsense -a 192.0.2.7", "\"nonsense\" is not a valid iSCSI name: "},
      {"statictarget add -A hba0 -n iqn.2026-11.org.example:t -a :3260", "The address has no host."},
      {"statictarget remove -A hba0 -n iqn.2026-11.org.example:t -a [2001:db8::9]:1",
       "The adapter hba0 has no static target iqn.2026-11.org.example:t,[2001:db8::9]:1."},
      {"statictarget remove -A hba0 -n iqn.2026-11.org.example:found -a 192.0.2.7",
       "iqn.2026-11.org.example:found,192.0.2.7:3260 is no static target: it was found through the "
       "sendtarget 192.0.2.1:3260."},
  };
  Harness host(kHost);
  const json before = host.Show();
  for (const auto& [command, reason] : cases) {
    const Outcome run = host(std::string("iscsi adapter discovery ") + command);
    ASSERT_EQ(run.messages.size(), 2u) << command;
    EXPECT_THAT(run.messages[0], StartsWith(reason));
    EXPECT_EQ(host.Show(), before);
  }
}

TEST(Discovery, WhatWasFoundMayBeStaticBesides) {
  Harness host(kHost);
  const std::string place = " -A hba0 -n iqn.2026-11.org.example:found -a 192.0.2.7";
  ASSERT_EQ(host("iscsi adapter target portal param set -k LoginTimeout -v 9" + place).result, true);
  const json found = host.Show();
  const std::string list = "iscsi adapter discovery statictarget ";
  EXPECT_EQ(host(list + "add" + place).result, true);
  EXPECT_EQ(host(list + "list").result[1]["Target Name"], "iqn.2026-11.org.example:found");
  EXPECT_THAT(host(list + "add" + place).messages[0], HasSubstr("has the static target"));
  EXPECT_EQ(host(list + "remove" + place).result, true);
  EXPECT_EQ(host.Show(), found);
}

}  // namespace

// iscsi adapter discovery: rediscovery and its status, the lists of sendtargets and of static targets.
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

TEST(Discovery, RediscoveryStartsAndTheStatusTells) {
  Harness host(kHost);
  EXPECT_EQ(host("iscsi adapter discovery status get -A hba0").result, "Discovery Completed");
  EXPECT_EQ(host("iscsi adapter discovery rediscover -A hba0").result, "Rediscovery started");
  EXPECT_EQ(host("iscsi adapter discovery status get -A hba0").result,
            "Discovery Completed, Some iSCSI Targets failed to login.");
  Harness other(
      R"({"adapters": [{"name": "late", "discoveryStatus": 1}, {"name": "odd", "discoveryStatus": 7}]})");
  EXPECT_EQ(other("iscsi adapter discovery status get -A late").result, "Discovery Timeout");
  EXPECT_EQ(other("iscsi adapter discovery status get -A odd").result, "unknown");
}

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
    EXPECT_EQ(row["Adapter"], "hba0");
    listed.push_back(row["Sendtarget"]);
  }
  EXPECT_THAT(listed,
              ElementsAre("storage1:3260", "[2001:db8::1]:3260", "[2001:db8::1]:860", "192.0.2.1:860"));
  EXPECT_EQ(host("iscsi adapter discovery sendtarget list").result.size(), 4u);
  EXPECT_EQ(host("iscsi adapter discovery sendtarget list --adapter=").result.size(), 4u);
  EXPECT_EQ(host("iscsi adapter discovery sendtarget list -A bare").result, json::array());
  EXPECT_EQ(Harness("{}")("iscsi adapter discovery sendtarget list").result, json::array());
}

TEST(Discovery, StaticTargetsAreListedThroughTheManagementApi) {
  Harness host(kHost);
  EXPECT_EQ(
      host("iscsi adapter discovery statictarget add -A hba0 -n iqn.2026-11.org.example:t -a 2001:db8::2")
          .result,
      true);
  EXPECT_EQ(host("iscsi adapter discovery statictarget add -A hba0 -n iqn.2026-11.org.example:t -a name:860")
                .result,
            true);
  const Outcome run = host("iscsi adapter discovery statictarget list");
  EXPECT_EQ(run.result, json::parse(R"([
      {"Adapter": "hba0", "Target Name": "iqn.2026-11.org.example:boot", "Target Address": "192.0.2.7:3260",
       "TPGT": "3", "Boot": "true"},
      {"Adapter": "hba0", "Target Name": "iqn.2026-11.org.example:t", "Target Address": "[2001:db8::2]:3260",
       "TPGT": "na", "Boot": "false"},
      {"Adapter": "hba0", "Target Name": "iqn.2026-11.org.example:t", "Target Address": "name:860",
       "TPGT": "na", "Boot": "false"}])"));
  EXPECT_EQ(host("iscsi adapter discovery statictarget list --adapter=").result, json::array());
  EXPECT_EQ(
      host(
          "iscsi adapter discovery statictarget remove -A hba0 -n iqn.2026-11.org.example:t -a 2001:db8:0::2")
          .result,
      true);
  EXPECT_EQ(host("iscsi adapter discovery statictarget list -A hba0").result.size(), 2u);

  Harness unknown(
      WithAnswers(kHost, R"({"operation": "IMA_TSR_GetInternalConfigData", "imaStatus": 2147483649})"));
  EXPECT_EQ(unknown("iscsi adapter discovery statictarget list").result[0]["Boot"], "na");
  Harness escaping(WithAnswers(kHost, R"({"operation": "ConvertHostAddress", "throw": "NodeCtlException"})"));
  const Outcome escaped = escaping("iscsi adapter discovery statictarget list");  // leaks nothing either
  EXPECT_EQ(escaped.status, 4);
}

struct Change {
  const char* command;
  const char* name;  ///< the option that names the target
  const char* failure;
};
const Change kChanges[] = {
    {"sendtarget add", "", "Unable to add sendtarget address."},
    {"sendtarget remove", "", "Failed to remove sendtarget."},
    {"statictarget add", " -n iqn.2026-11.org.example:boot", "Failed to add static target."},
    {"statictarget remove", " -n iqn.2026-11.org.example:boot", "Failed to remove static target."},
};

TEST(Discovery, ChangesOfTheListsTellTheReasonFirst) {
  for (const Change& change : kChanges) {
    const std::string bare = std::string("iscsi adapter discovery ") + change.command + change.name;
    const std::string command = bare + " -A hba0";
    const bool removes = std::string(change.command).find("remove") != std::string::npos;
    Harness host(kHost);
    const struct {
      const char* address;
      const char* reason;
    } cases[] = {
        {"192.0.2.8:x", "Invalid port number."},
        {"[fe80::1]", "Invalid address, expected format is [ipv6]:port)"},
        {"300.0.0.1", "\"300.0.0.1\" is not an IPv4 address, an IPv6 address or a host name."},
    };
    for (const auto& c : cases) {
      const Outcome run = host(command + " -a " + c.address);
      EXPECT_THAT(run.messages, ElementsAre(c.reason, change.failure)) << command;
      EXPECT_THAT(run.Calls(), ElementsAre("GetScsiInterface"));
    }
    const Outcome empty = host(bare + " -a '' -A nosuch");
    EXPECT_THAT(empty.messages, ElementsAre(removes ? kUnknownAdapter : "Invalid address input.")) << command;
  }
  Harness host(kHost);
  const std::string add = "iscsi adapter discovery statictarget add -n '' -A nosuch -a ";
  EXPECT_THAT(host(add + "''").messages, ElementsAre("Invalid address input."));
  EXPECT_THAT(host(add + "192.0.2.1").messages, ElementsAre("Invalid iscsi name input."));
}

TEST(Discovery, TheHostRefusesWhatItHasLacksOrCannotTake) {
  const struct {
    const char* command;
    const char* reason;
  } cases[] = {
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
       "sendtarget "
       "192.0.2.1:3260."},
  };
  Harness host(kHost);
  for (const auto& c : cases) {
    const json before = host.Show();
    const Outcome run = host(std::string("iscsi adapter discovery ") + c.command);
    ASSERT_EQ(run.messages.size(), 2u) << c.command;
    EXPECT_THAT(run.messages[0], StartsWith(c.reason));
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

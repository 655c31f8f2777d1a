// iscsi ibftboot get|import.
#include "support/Harness.h"

namespace {

using nlohmann::json;
using testing::ElementsAre;

constexpr char kHost[] = R"({
  "bootTables": [
    {"table": "secondary", "enabled": 1, "targetName": "iqn.2026-11.org.example:second"},
    {"table": "primary", "enabled": 2, "macAddress": "02:00:00:00:00:01", "targetIP": "192.0.2.80",
     "targetPort": 860, "targetName": "iqn.2026-11.org.example:boot", "chapType": 2, "chapName": "one",
     "chapPwd": "secret-one-0123", "reverseChapName": "two", "reverseChapPwd": "secret-two-0123"}],
  "adapters": [
    {"name": "dep", "kind": "dependent",
     "capabilities": {"Static Discovery Settable": true, "CHAP Authorization Supported": true,
                      "Mutual Authentication Supported": true, "Target Level Authentication Supported": true,
                      "Target Level Mutual Authentication Supported": true},
     "physicalPortals": [{"name": "phy0", "mac": "02:00:00:00:00:01"}]},
    {"name": "plain", "kind": "dependent", "physicalPortals": [{"name": "phy0", "mac": "02:00:00:00:00:01"}]},
    {"name": "ind", "kind": "independent", "capabilities": {"Static Discovery Settable": true}}]})";

TEST(IbftBoot, GetShowsThePrimaryTable) {
  EXPECT_EQ(Harness(kHost)("iscsi ibftboot get").result[0]["Target Name"], "iqn.2026-11.org.example:boot");
  const json empty = Harness("{}")("iscsi ibftboot get").result;
  ASSERT_EQ(empty.size(), 1u);
  EXPECT_EQ(empty[0]["Target Name"], "");
}

TEST(IbftBoot, ImportMarksTheTargetOnEveryEligibleAdapter) {
  Harness host(kHost);
  for (int time = 0; time < 2; ++time) {  // the second finds all in place
    const Outcome run = host("iscsi ibftboot import");
    EXPECT_EQ(run.result, true);
    EXPECT_THAT(run.trace, ElementsAre("MountiScsiBootLun(true, true) = ok"));
    const json targets = host.Show("/adapters/0/staticTargets");
    ASSERT_EQ(targets.size(), 1u);
    EXPECT_TRUE(targets[0]["name"] == "iqn.2026-11.org.example:boot" && targets[0]["boot"] == true);
    EXPECT_TRUE(targets[0]["host"] == "192.0.2.80" && targets[0]["port"] == 860) << targets;
    EXPECT_TRUE(host.Show("/adapters/1/staticTargets").empty());
    EXPECT_TRUE(host.Show("/adapters/2/staticTargets").empty());
  }
}

TEST(IbftBoot, ImportTakesChapFromTheTableAndTheAdapterByItsMac) {
  // What an import of mutual CHAP left behind.
  constexpr char kImported[] =
      R"({"staticTargets": [{"name": "iqn.2026-11.org.example:boot", "host": "192.0.2.80",
      "port": 860, "chap": {"uni": {"name": "once", "secret": "x"}, "mutual": {"name": "two", "secret": "y"}}}]})";
  const json required = json::parse(
      R"({"uni": {"inherited": false, "name": "one", "secret": "secret-one-0123", "level": "required"}})");
  // What is different in the table and in the first adapter, and the CHAP of the static target; null without
  // one.
  const std::tuple<std::string, std::string, json> cases[] = {
      {R"({"chapType": 0})", "{}", json::object()},
      {R"({"chapType": 1})", "{}", required},
      {R"({"chapType": 0})", kImported, json::object()},
      {R"({"chapType": 1})", kImported, required},
      {R"({"chapType": 1, "chapPwd": ""})", "{}", nullptr},
      {R"({"chapType": 2, "reverseChapName": ""})", "{}", nullptr},
      {R"({"chapType": 3})", "{}", nullptr},
      {R"({"chapType": 1})", R"({"capabilities": {"Target Level Authentication Supported": false}})",
       nullptr},
      {R"({"chapType": 2})", R"({"capabilities": {"Target Level Mutual Authentication Supported": false}})",
       nullptr},
      {R"({"chapType": 0})", R"({"state": 1})", nullptr},
      {R"({"chapType": 0})", R"({"capabilities": {"Static Discovery Settable": false}})", nullptr},
      {R"({"chapType": 0, "targetIP": "2001:db8::80"})", "{}", nullptr},
      {R"({"chapType": 0, "targetIP": "2001:db8::80"})", R"({"capabilities": {"IPv6 Supported": true}})",
       json::object()},
      {R"({"chapType": 0, "macAddress": "02-00-00-00-00-01"})", "{}", json::object()},
      {R"({"chapType": 0, "macAddress": "02:00:00:00:00:02"})", "{}", nullptr},
      {R"({"chapType": 0, "macAddress": "02:00:00:00:00:02"})", R"({"networkPortals": [{"nic": "nic2"}]})",
       json::object()},
      {R"({"chapType": 0, "macAddress": "nonsense"})", "{}", nullptr},
      {R"({"chapType": 0, "macAddress": ""})", R"({"physicalPortals": []})", json::object()},
  };
  for (const auto& [table, adapter, chap] : cases) {
    json description = json::parse(kHost);
    description["nics"] = json::parse(R"([{"name": "nic2", "mac": "02:00:00:00:00:02"}])");
    description["bootTables"][1].update(json::parse(table));
    description["adapters"].erase(1);  // "plain", which cannot take CHAP, and nothing else
    description["adapters"][0].update(json::parse(adapter), true);
    SCOPED_TRACE(table + adapter);
    Harness host(description.dump());
    const Outcome run = host("iscsi ibftboot import");
    EXPECT_EQ(run.result, chap.is_null() ? json() : json(true));
    EXPECT_EQ(run.trace[0].find("secret-"), std::string::npos);
    const json targets = host.Show("/adapters/0/staticTargets");
    ASSERT_EQ(targets.size(), chap.is_null() ? 0u : 1u);
    EXPECT_EQ(targets.empty() ? json() : targets[0]["chap"], chap);
  }
}

TEST(IbftBoot, ImportMovesTheMark) {
  json description = json::parse(kHost);
  description["adapters"][0]["staticTargets"] =
      json::parse(R"([{"name": "iqn.2026-11.org.example:old", "host": "192.0.2.81", "boot": true}])");
  Harness host(description.dump());
  EXPECT_EQ(host("iscsi ibftboot import").result, true);
  EXPECT_EQ(host.Show("/adapters/0/staticTargets/0/boot"), false);
  EXPECT_EQ(host.Show("/adapters/0/staticTargets/1/boot"), true);
}

TEST(IbftBoot, ATableThatCannotBeUsedIsRefusedWithoutItsSecret) {
  // No table, one that is off, and one without a usable target.
  for (const char* table : {"[]", R"([{"table": "primary", "targetName": "iqn.2026-11.org.example:boot"}])",
                            R"([{"table": "primary", "enabled": 1, "chapPwd": "secret-one-0123"}])"}) {
    json host = json::parse(kHost);
    host["bootTables"] = json::parse(table);
    const Outcome run = Harness(host.dump())("iscsi ibftboot import");
    EXPECT_THAT(run.messages, ElementsAre("Unable to import IBFT Boot table."));
    EXPECT_EQ(run.trace[0].find("secret-"), std::string::npos);
  }
}

}  // namespace

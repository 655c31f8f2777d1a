// iscsi session list, add and remove, and session connection list: what they show, select and change.
#include "support/Harness.h"

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr char kHost[] = R"({"remoteTargets": [
  {"name": "t0", "portals": [{"host": "192.0.2.1", "tag": 3}]},
  {"name": "t1", "portals": [{"host": "192.0.2.2"}]},
  {"name": "closed", "portals": [{"host": "192.0.2.3"}], "refusedInitiators": ["iqn.2026-11.org.example:one"]},
  {"name": "new", "portals": [{"host": "198.51.100.9", "tag": 9}]}],
 "adapters": [
  {"name": "hba0", "initiatorName": "iqn.2026-11.org.example:zero", "targets": [
    {"name": "t0", "addresses": [{"address": "192.0.2.1", "tag": 3}], "sessions": [
      {"isid": "00023d000001", "tsih": 5, "targetPortalGroupTag": 3,
       "connections": [{"cid": 0, "remoteAddress": "192.0.2.1"}, {"cid": 65535, "state": 8}]},
      {"isid": "80aabbccddee", "authMethod": 2, "immediateData": false}]},
    {"name": "t1", "addresses": [{"address": "192.0.2.2"}]}]},
  {"name": "hba1", "initiatorName": "iqn.2026-11.org.example:one", "targets": [
    {"name": "t0", "sessions": [{"isid": "00023d000001", "immediateData": false, "initialR2T": false,
                                 "firstBurstLength": 512, "connections": [{"cid": 1}]}]},
    {"name": "closed", "addresses": [{"address": "192.0.2.3"}]}],
   "staticTargets": [{"name": "new", "host": "198.51.100.9", "portalGroup": 9}]},
  {"name": "hba2"},
  {"name": "hba3", "state": 1, "targets": [{"name": "t0"}]}]})";

TEST(SessionList, FirstBurstLengthAndMethodHaveWordsOfTheirOwn) {
  const Outcome run = Harness(kHost)("iscsi session list");
  ASSERT_EQ(run.result.size(), 3u);
  EXPECT_EQ(run.result[1]["AuthenticationMethod"], "unsupported");
  EXPECT_EQ(run.result[1]["FirstBurstLength"], "Irrelevant");  // no immediate data, and R2T first
  EXPECT_EQ(run.result[2]["AuthenticationMethod"], "none");
  EXPECT_EQ(run.result[2]["FirstBurstLength"], "512");
}

TEST(SessionList, FiltersCombine) {
  Harness host(kHost);
  const std::pair<const char*, std::size_t> cases[] = {
      {"-s 00023d000001", 2}, {"-s 00023D000001", 0}, {"-A hba1 -s 00023d000001", 1}, {"-A hba2", 0}};
  for (const auto& [options, count] : cases) {
    EXPECT_EQ(host(std::string("iscsi session list ") + options).result.size(), count) << options;
    const Outcome connections = host(std::string("iscsi session connection list ") + options);
    EXPECT_EQ(connections.result.empty(), count == 0) << options;
  }
}

TEST(ConnectionList, ShowsTheLastCidAndAnUnknownState) {
  const Outcome run = Harness(kHost)("iscsi session connection list");
  ASSERT_EQ(run.result.size(), 3u);
  EXPECT_EQ(run.result[1]["ID"], "hba0,t0,00023d000001,65535");
  EXPECT_EQ(run.result[1]["State"], "unknown");
}

TEST(ConnectionList, CidIsReadAsFarAsItIsANumber) {
  Harness host(kHost);
  const std::pair<const char*, nlohmann::json> cases[] = {
      {"0", 0},     {"abc", 0},          {"''", 0},       {"65535", 65535},
      {"' 1x'", 1}, {"131071", nullptr}, {"-1", nullptr}, {"99999999999999999999", nullptr},
  };
  for (const auto& [cid, shown] : cases) {
    const Outcome run = host(std::string("iscsi session connection list --cid=") + cid);
    ASSERT_EQ(run.result.size(), shown.is_null() ? 0u : 1u) << cid;
    EXPECT_EQ(shown.is_null() ? nullptr : run.result[0]["CID"], shown) << cid;
  }
}

TEST(ConnectionList, UnknownDigestLeavesTheCommand) {
  Harness host(R"({"adapters": [{"name": "a", "targets": [{"name": "t", "sessions": [
      {"isid": "000000000000", "connections": [{"cid": 0, "dataDigest": 2}]}]}]}]})");
  const Outcome run = host("iscsi session connection list");
  EXPECT_EQ(run.status, 4);
  EXPECT_THAT(run.failure, testing::HasSubstr("Invalid digest value"));
}

constexpr char kNoMatch[] = "Failed to find matching object.";

TEST(SessionSelection, SaysNothingMoreOfWhatIsNotThere) {
  for (const char* verb : {"add", "remove"}) {
    const std::string command = std::string("iscsi session ") + verb + ' ';
    for (const char* options : {"-A hba0 -n T0", "-A hba0 -n t1 -s 00023d000001",
                                "-A hba0 -n t0 -s 80AABBCCDDEE", "-A hba0 -n ''"}) {
      const Outcome run = Harness(kHost)(command + options);
      EXPECT_THAT(run.messages, ElementsAre(kNoMatch)) << options;
    }
    const Outcome alone = Harness(kHost)(command + "-A hba0 -s 00023d000001");
    EXPECT_THAT(alone.messages,
                ElementsAre("Should not use isid option alone, missing target option.", kNoMatch));
    EXPECT_THAT(alone.trace, IsEmpty());
  }
}

/// The sessions of the adapter as "target/isid/tsih/tag".
std::vector<std::string> Sessions(Harness& host, const char* adapter) {
  std::vector<std::string> sessions;
  for (const auto& row : host(std::string("iscsi session list -A ") + adapter).result) {
    sessions.push_back(row["Target"].get<std::string>() + '/' + row["ISID"].get<std::string>().substr(8) +
                       '/' + row["TSIH"].dump() + '/' + row["TargetPortalGroupTag"].dump());
  }
  return sessions;
}

TEST(SessionAdd, LogsInWhatIsSelected) {
  Harness host(kHost);
  const Outcome run = host("iscsi session add -A hba0");
  EXPECT_EQ(run.result, true);
  EXPECT_THAT(run.Calls(), ElementsAre("IMA_GetLhbaOidList", "IMA_GetLhbaProperties", "IMA_TSR_AddSession"));
  EXPECT_THAT(run.trace.back(), testing::HasSubstr(", 0, 0, 0) = 0x00000000"));
  // The target that had sessions keeps them; the other one got its first.
  EXPECT_THAT(Sessions(host, "hba0"), ElementsAre("t0/0001/5/3", "t0/ddee/1/1", "t1/0001/1/1"));

  EXPECT_EQ(host("iscsi session add -A hba0 -n t0").result, true);
  EXPECT_EQ(host("iscsi session add -A hba0 -n t0 -s 00023d000001").result, true);
  EXPECT_THAT(Sessions(host, "hba0"),
              ElementsAre("t0/0001/5/3", "t0/ddee/1/1", "t0/0001/2/3", "t0/0002/3/3", "t1/0001/1/1"));
  const nlohmann::json added = host("iscsi session list -A hba0 -n t0").result[2];
  EXPECT_EQ(added["ISID"].get<std::string>().substr(0, 2), "80");  // the random type
}

TEST(SessionAdd, RefusalShowsAsLastError) {
  Harness host(kHost);
  for (const char* line : {"iscsi session add -A hba1", "iscsi session add -A hba1 -n closed"}) {
    EXPECT_THAT(host(line).messages, ElementsAre("Failed to add session.")) << line;
  }
  // The others of the adapter were logged in all the same, the one known from its portal alone too.
  EXPECT_THAT(Sessions(host, "hba1"), ElementsAre("t0/0001/1/1", "new/0001/1/9"));
  EXPECT_EQ(host("iscsi adapter target list -A hba1 -n closed").result[0]["Last Error"],
            "0x0202 Initiator is not allowed access to the given target.");

  EXPECT_THAT(host("iscsi session add -A hba3").messages, ElementsAre("Failed to add session."));  // offline
}

TEST(SessionRemove, LogsOutWhatIsSelected) {
  Harness host(kHost);
  EXPECT_EQ(host("iscsi session remove -A hba0 -n t0 -s 00023d000001").result, true);
  EXPECT_THAT(Sessions(host, "hba0"), ElementsAre("t0/ddee/1/1"));
  EXPECT_EQ(host("iscsi session add -A hba0").result, true);
  EXPECT_EQ(host("iscsi session remove -A hba0 -n t0").result, true);
  EXPECT_THAT(Sessions(host, "hba0"), ElementsAre("t1/0001/1/1"));
  EXPECT_EQ(host("iscsi session remove -A hba0").result, true);
  EXPECT_EQ(host("iscsi session remove -A hba0").result, true);  // nothing left to do
  EXPECT_THAT(Sessions(host, "hba0"), IsEmpty());
  EXPECT_EQ(Sessions(host, "hba1").size(), 1u);
  EXPECT_EQ(host("iscsi session remove -A hba1 -n new").result, true);  // known from its portal alone
}

}  // namespace

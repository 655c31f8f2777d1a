// How a host stands, at a glance.
#include "status/Status.h"

#include <algorithm>
#include <set>

#include "support/Harness.h"

namespace {

using nlohmann::json;
using testing::ElementsAre;

/// An adapter with nothing wrong, and one with each thing that can be; a name that a shell would take apart.
constexpr char kHost[] = R"({
 "nics": [{"name": "nic1"}],
 "adapters": [
  {"name": "well", "kind": "independent", "driver": "hq4", "properties": {"description": "HQ4 4062"},
   "capabilities": {"CHAP Authorization Supported": true},
   "chap": {"uni": {"level": "required", "name": "n", "secret": "s3cr3t"}}, "targets": [
    {"name": "t0", "sessions": [{"isid": "00023d000000", "connections": [{"cid": 0}, {"cid": 1}]},
                                {"isid": "00023d000001", "connections": [{"cid": 0}]}]},
    {"name": "t1"}]},
  {"name": "wa it", "kind": "independent", "discoveryStatus": 1, "capabilities": {"MTU Settable": true},
   "applies": {"mtu": "reboot"}, "physicalPortals": [{"name": "phy0"}]},
  {"name": "ill", "kind": "independent", "discoveryStatus": 2, "targets": [
    {"name": "t0", "loginStatus": 328193, "sessions": [
      {"isid": "00023d000000", "connections": [{"cid": 0, "state": 7}, {"cid": 1}]}]},
    {"name": "t1", "loginStatus": 328195}, {"name": "t2", "loginStatus": 196609}, {"name": "t3"}, {"name": "t4"}]},
  {"name": "down", "kind": "independent", "state": 1}]})";

Outcome StatusOf(Harness& host, const std::string& options = "") {
  return host(TessaroCli::Status::NewStatus(), options);
}

/// The rows without the commands that look closer.
std::vector<std::string> Lines(const Outcome& run) {
  std::vector<std::string> lines;
  for (const json& row : run.result) {
    std::string line;
    for (const char* field : {"State", "Where", "Kind", "Finding", "Detail", "Targets"}) {
      line += row.at(field).get<std::string>() + '|';
    }
    lines.push_back(line + std::to_string(row.at("Count").get<int>()));
  }
  return lines;
}

TEST(Status, TellsFaultsFirst) {
  Harness host(kHost);
  host("iscsi physicalnetworkportal param set -A 'wa it' -o MTU -v 9000");
  const Outcome run = StatusOf(host);
  EXPECT_EQ(run.status, 0);
  EXPECT_THAT(
      Lines(run),
      ElementsAre(
          "fault|host|summary|4 adapters, 3 sessions with 2 of 7 targets, 3 faults, 2 warnings|||5",
          "fault|ill|login|the last login to 3 targets failed||t0: authentication failure (0x0201), "
          "t1: not found (0x0203), t2: failed without a response (0x30001)|3",
          "fault|ill|connection|1 connection is not logged in||t0|1",
          "fault|down|adapter|offline, no targets, CHAP prohibited|||0",
          "warning|wa it|discovery|a portal did not answer the last discovery|||1",
          "warning|wa it|pending|1 change waits for a reset or a reboot|||1",
          "ok|well|adapter|online, 2 sessions with 1 of 2 targets, CHAP required|HQ4 4062, driver hq4|t0 (2 "
          "sessions); not connected: t1|2",
          "ok|wa it|adapter|online, no targets, CHAP prohibited|||0",
          "ok|ill|adapter|online, 1 session with 1 of 5 targets, CHAP prohibited||t0; not connected: t1, t2, "
          "t3 and 1 other|1"));
  for (const std::string& closer : run.Column("Look Closer")) {
    if (closer.starts_with("hcli iscsi ")) {
      EXPECT_EQ(host(closer.substr(5)).status, 0) << closer;
    }
  }
  const std::string screen = StatusOf(host).out;
  EXPECT_LE(std::count(screen.begin(), screen.end(), '\n'), 24) << screen;
  EXPECT_EQ(screen.find("s3cr3t"), screen.npos);
}

TEST(Status, IsAnAnswerWhereThereIsNothing) {
  Harness host(R"({})");
  EXPECT_THAT(Lines(StatusOf(host)), ElementsAre("warning|host|summary|no iSCSI adapter|||0"));
}

/// What fails at one adapter is told, and the others are shown as they are.
TEST(Status, GoesOnBehindWhatFails) {
  Harness healthy(kHost);
  const Outcome whole = StatusOf(healthy);
  const std::vector<std::string> calls = whole.Calls();
  const std::vector<std::string> lines = Lines(whole);
  const auto isOthers = [](const std::string& line) { return line.find("|ill|") == line.npos; };
  for (const std::string& call : std::set<std::string>(calls.begin(), calls.end())) {
    SCOPED_TRACE(call);
    const bool isIma = call.starts_with("IMA_");
    const std::string how =
        isIma ? R"("imaStatus": 2147483651)" : R"("throw": "NodeCtlException", "text": "Broken.")";
    Harness host(WithAnswers(kHost, R"({"operation": ")" + call + R"(", "adapter": "ill", )" + how + '}'));
    const Outcome run = StatusOf(host);
    const bool isListing = call == "GetiScsiInterfaces" || call == "IMA_GetLhbaOidList";  // of no adapter's
    if (isListing || call == "IMA_TSR_GetInternalConfigData") {
      EXPECT_EQ(run.status, 0);  // an adapter may know no login status
      continue;
    }
    EXPECT_EQ(run.status, 3);
    EXPECT_EQ(run.messages.size(), 1u);
    const bool isName = call == "GetName" || call == "IMA_GetLhbaProperties";
    EXPECT_THAT(Lines(run),
                testing::Contains(testing::HasSubstr("fault|" + std::string(isName ? "" : "ill|unread"))));
    for (std::size_t i = 1; i < lines.size(); ++i) {
      if (isOthers(lines[i]) && call != "IMA_GetLhbaProperties") {
        EXPECT_THAT(Lines(run), testing::Contains(lines[i]));
      }
    }
  }
  for (const auto& [answer, row] : std::vector<std::pair<std::string, std::string>>{
           {R"({"operation": "GetiScsiInterfaces", "throw": "CoreCtlException", "text": "Broken."})",
            "fault|host|summary|the adapters cannot be listed|||1"},
           {R"({"operation": "IMA_GetLhbaOidList", "imaStatus": 2147483650})",
            "fault|well|unread|not all of it can be read|The logical adapters cannot be read: the management "
            "API "
            "answers 0x80000002.||1"}}) {
    Harness host(WithAnswers(kHost, answer));
    const Outcome run = StatusOf(host);
    EXPECT_EQ(run.status, 3);
    EXPECT_EQ(run.messages.size(), 1u);
    EXPECT_THAT(Lines(run), testing::Contains(row));
  }
}

/// A screen for a host of any size, in one walk.
TEST(Status, FitsOnAScreenHoweverManyTargetsThereAre) {
  json host = {{"adapters", json::array()}};
  for (int adapter = 0; adapter < 4; ++adapter) {
    json& added = host["adapters"].emplace_back(
        json{{"name", "hba" + std::to_string(adapter)}, {"kind", "independent"}, {"targets", json::array()}});
    for (int target = 0; target < 500; ++target) {
      added["targets"].push_back(
          {{"name", "t" + std::to_string(target)}, {"loginStatus", target % 2 * 328193}});
    }
  }
  Harness large(host.dump());
  const Outcome run = StatusOf(large);
  EXPECT_EQ(run.result[1]["Finding"], "the last login to 250 targets failed");
  EXPECT_LE(std::count(run.out.begin(), run.out.end(), '\n'), 36);
  EXPECT_LE(run.trace.size(), 2000u * 3 + 4 * 10);
}

}  // namespace

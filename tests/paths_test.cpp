// Network portals as paths: the status that follows from the sessions, and unbinding under sessions.
#include "support/Harness.h"

namespace {

using nlohmann::json;
using testing::ElementsAre;

/// An adapter with the portals "a" and "b", and for each word a target: with one session for each letter,
/// over the portal of that name; over one that is not told for a dash.
std::string HostWith(const std::vector<std::string>& targets) {
  json adapter =
      json::parse(R"({"name": "s0", "kind": "software", "networkPortals": [{"nic": "a"}, {"nic": "b"}]})");
  adapter["targets"] = json::array();
  for (const std::string& portals : targets) {
    json target = {{"name", "iqn.2026-11.org.example:" + std::to_string(adapter["targets"].size())},
                   {"sessions", json::array()}};
    for (const char portal : portals) {
      json session = {{"isid", "80000000000" + std::to_string(target["sessions"].size())},
                      {"connections", {{{"cid", 0}}}}};
      if (portal != '-') session["portal"] = std::string(1, portal);
      target["sessions"].push_back(session);
    }
    adapter["targets"].push_back(target);
  }
  return json{{"nics", {{{"name", "a"}}, {{"name", "b"}}}}, {"adapters", json::array({adapter})}}.dump();
}

TEST(Paths, StatusFollowsFromTheSessions) {
  const struct {
    std::vector<std::string> targets;
    const char* a;
    const char* b;
    std::size_t left;  // sessions that are left once "a" is unbound by force
  } cases[] = {
      {{}, "unused", "unused", 0},
      {{""}, "unused", "unused", 0},
      {{"aa"}, "last path", "standby", 0},
      {{"ab"}, "active", "active", 1},
      {{"ab", "a"}, "last path", "active", 1},
      {{"a", "b"}, "last path", "last path", 1},
      {{"x"}, "standby", "standby", 1},  // over a portal that is bound no more
      {{"-"}, "active", "active", 0},
  };
  for (const auto& [targets, a, b, left] : cases) {
    SCOPED_TRACE(json(targets).dump());
    Harness host(HostWith(targets));
    EXPECT_THAT(host("iscsi networkportal list").Column("Path Status"), ElementsAre(a, b));
    const std::size_t before = host("iscsi session list").result.size();
    const Outcome refused = host("iscsi networkportal remove -A s0 -n a");
    const bool used = left < before;
    EXPECT_EQ(refused.result, used ? json() : json(true));
    if (used) {
      EXPECT_THAT(refused.messages, ElementsAre("Unable to unbind iscsi port."));
      EXPECT_EQ(host("iscsi session list").result.size(), before);
      EXPECT_EQ(host("iscsi networkportal remove -A s0 -n a -f true").result, true);
    }
    EXPECT_EQ(host("iscsi session list").result.size(), left);
    EXPECT_EQ(host("iscsi networkportal list").result.size(), 1u);
  }
}

TEST(Paths, ANicThatDoesNotComplyIsRefusedWithItsRemedy) {
  for (const std::string message : {"Two uplinks.", "two uplinks"}) {
    json description = json::parse(HostWith({}));
    description["nics"].push_back({{"name", "c"},
                                   {"complianceCode", 4},
                                   {"nonCompliantMessage", message},
                                   {"nonCompliantRemedy", "Leave one."}});
    EXPECT_EQ(Harness(description.dump())("iscsi networkportal add -A s0 -n c").trace.back(),
              "BindHostnic(s0, \"c\", false) ! NodeCtlException: The NIC \"c\" is not compliant: " + message +
                  (message == "two uplinks" ? ". Leave one." : " Leave one."));
  }
}

}  // namespace

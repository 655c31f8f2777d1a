// The route commands, which stand on no path: what they read of an entry, and the calls that they make.
#include "Registration.h"
#include "support/Harness.h"

namespace TessaroCli::IscsiNamespace {

class RouteAdd;
class RouteList;
class RouteRemove;

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr char kInvalidAdapter[] = "Invalid adapter specified or unable to get adapter.";
constexpr char kInvalidAddress[] = "Invalid address input.";

constexpr char kHost[] = R"({
  "nics": [{"name": "nic0", "ipv4Address": "192.0.2.5"}, {"name": "nic1"}],
  "adapters": [
    {"name": "hba0", "kind": "software", "networkPortals": [{"nic": "nic0"}, {"nic": "nic1"}], "routes": [
      {"destination": "198.51.100.0", "netmask": "255.255.255.0", "gateway": "192.0.2.1", "interface": "nic0"},
      {"destination": "198.51.100.0", "netmask": "255.255.255.0", "gateway": "192.0.2.1", "metric": 2,
       "interface": "nic1"},
      {"destination": "::", "netmask": "::", "gateway": "2001:db8::1", "associated": false,
       "interface": "an-interface-name-of-32-bytes-he"}]},
    {"name": "hba1", "routes": [
      {"destination": "0.0.0.0", "netmask": "0.0.0.0", "gateway": "192.0.2.1", "interface": ""}]},
    {"name": "hba2"}]})";

Outcome Add(Harness& host, const std::string& options) { return host("RouteAdd", Make<RouteAdd>(), options); }
Outcome Remove(Harness& host, const std::string& options) {
  return host("RouteRemove", Make<RouteRemove>(), options);
}
Outcome List(Harness& host, const std::string& options) {
  return host("RouteList", Make<RouteList>(), options);
}

/// The last route of hba0 as "destination netmask gateway metric interface".
std::string LastRoute(Harness& host) {
  const nlohmann::json route = List(host, "-A hba0").result.back();
  const auto text = [&](const char* field) { return route[field].get<std::string>() + ' '; };
  return text("destination") + text("netmask") + text("gateway") + route["metric"].dump() + ' ' +
         route["interface"].get<std::string>() + ' ' + route["associated"].get<std::string>();
}

TEST(RouteList, ShowsWhatTheAdaptersHave) {
  Harness host(kHost);
  const Outcome all = List(host, "");
  ASSERT_EQ(all.result.size(), 4u);
  EXPECT_EQ(all.result[0], nlohmann::json::parse(R"({"adapter": "hba0", "destination": "198.51.100.0",
      "netmask": "255.255.255.0", "gateway": "192.0.2.1", "metric": 1, "associated": "YES",
      "interface": "nic0"})"));
  EXPECT_EQ(all.result[2]["associated"], "NO");
  EXPECT_EQ(all.result[2]["gateway"], "2001:db8::1");
  EXPECT_EQ(all.result[2]["interface"], "an-interface-name-of-32-bytes-he");
  EXPECT_EQ(all.result[3]["adapter"], "hba1");

  EXPECT_EQ(List(host, "-n nic1").result.size(), 1u);
  EXPECT_EQ(List(host, "-n an-interface-name-of-32-bytes-here").result.size(), 1u);  // 32 bytes count
  EXPECT_EQ(List(host, "-n ''").result.size(), 1u);
  EXPECT_THAT(List(host, "-A hba1").Calls(),  // ends behind the adapter
              ElementsAre("IMA_GetLhbaOidList", "IMA_GetLhbaProperties", "IMA_GetLhbaProperties",
                          "IMA_TSR_GetRouteOidList", "IMA_TSR_GetRouteProperties"));
}

TEST(RouteList, OnlyAMissingListIsNoFailure) {
  Harness host(WithAnswers(kHost, R"({"operation": "IMA_TSR_GetRouteOidList", "imaStatus": 2147483649})"));
  const Outcome run = List(host, "-A hba0");
  EXPECT_THAT(run.result, IsEmpty());
  EXPECT_TRUE(run.closed && run.messages.empty());
  EXPECT_THAT(run.Calls(),
              ElementsAre("IMA_GetLhbaOidList", "IMA_GetLhbaProperties", "IMA_TSR_GetRouteOidList",
                          "IMA_GetLhbaProperties", "IMA_GetLhbaProperties"));
  Harness broken(WithAnswers(kHost, R"({"operation": "IMA_TSR_GetRouteProperties", "imaStatus": 1})"));
  EXPECT_THAT(List(broken, "").messages, ElementsAre("Operation not supported for this adapter."));
}

TEST(RouteAdd, ReadsTheEntry) {
  const std::pair<const char*, std::string> cases[] = {
      // the message, or the route that was added
      {"-s default", "0.0.0.0 0.0.0.0 192.0.2.9 1 nic1 YES"},
      {"-s 10.1.2.3/32 -c 7", "10.1.2.3 255.255.255.255 192.0.2.9 7 nic1 YES"},
      {"-s 0.0.0.0/ -c x", "0.0.0.0 0.0.0.0 192.0.2.9 0 nic1 YES"},
      {"-s 10.0.0.0/9bits", "10.0.0.0 255.128.0.0 192.0.2.9 1 nic1 YES"},
      {"-s 10.0.0.0 -m 255.0.0.0", "10.0.0.0 255.0.0.0 192.0.2.9 1 nic1 YES"},
      {"-s 10.0.0.0/33", kInvalidAddress},
      {"-s 10.0.0.0/-1", kInvalidAddress},
      {"-s 10.0.0.0/99999999999999999999", kInvalidAddress},
      {"-s 10.0.0.0", kInvalidAddress},
      {"-s 10.0.0.0/8 -m 255.0.0.0", "Unable to parse destination IP address."},
      {"-s 10.0.0.0 -m 8", "Unable to parse netmask IP address."},
      {"-s 10.0.0.1/8", "Add route failed."},               // not the address of its network
      {"-s 10.0.0.0 -m 255.0.255.0", "Add route failed."},  // a mask with gaps
      {"-s 10.0.0.0 -m ffff::", "Add route failed."},       // two families
      {"-s ::/0", "Add route failed."},                     // the derived mask is of IPv4
  };
  for (const auto& [options, outcome] : cases) {
    Harness host(kHost);
    const Outcome run = Add(host, std::string("-A hba0 -g 192.0.2.9 -n nic1 ") + options);
    EXPECT_EQ(run.messages.empty() ? LastRoute(host) : run.messages[0], outcome) << options;
    EXPECT_EQ(run.result, run.messages.empty() ? nlohmann::json(true) : nullptr);
    EXPECT_EQ(List(host, "").result.size(), run.messages.empty() ? 5u : 4u);
  }
  Harness host(kHost);
  const std::string rest = " -s 10.0.0.0/8 -n nic1 -g router";
  EXPECT_THAT(Add(host, "-A hba0" + rest).messages, ElementsAre("Unable to parse gateway IP address."));
  EXPECT_THAT(Add(host, "-A nohba" + rest).messages, ElementsAre(kInvalidAdapter));
  EXPECT_THAT(Add(host, "-A hba1" + rest).messages, ElementsAre("Unable to find network portal."));
  EXPECT_THAT(Add(host, "-A hba0 -n nic1 -g 192.0.2.1 -s 198.51.100.0/24 -c 2").messages,
              ElementsAre("Add route failed."));  // there already
}

TEST(RouteAdd, MakesTheseCalls) {
  Harness host(kHost);
  EXPECT_THAT(Add(host, "-A hba0 -s default -g 192.0.2.9 -n nic1").Calls(),
              ElementsAre("IMA_GetLhbaOidList", "IMA_GetLhbaProperties", "IMA_TSR_GetNetworkPortalOidList",
                          "IMA_GetNetworkPortalProperties", "IMA_TSR_GetLnpProperties",
                          "IMA_GetNetworkPortalProperties", "IMA_TSR_GetLnpProperties", "IMA_TSR_AddRoute",
                          "IMA_TSR_AssociateRoute"));
}

TEST(RouteRemove, RemovesTheFirstEntryThatMatchesInAll) {
  Harness host(kHost);
  const std::string entry = "-A hba0 -s 198.51.100.0/24 -g 192.0.2.1 -n nic0";
  for (const char* other :
       {"-A hba0 -s 198.51.100.0/25 -g 192.0.2.1 -n nic0", "-A hba0 -s 198.51.100.0/24 -g 192.0.2.2 -n nic0",
        "-A hba0 -s 198.51.100.0/24 -g 192.0.2.1 -n nic1",
        "-A hba0 -s 198.51.100.0/24 -g 192.0.2.1 -n nic0 -c 2"}) {
    EXPECT_THAT(Remove(host, other).messages, ElementsAre("Unable to find route.")) << other;
  }
  const Outcome run = Remove(host, entry);
  EXPECT_EQ(run.result, true);
  EXPECT_THAT(run.Calls(),
              ElementsAre("IMA_GetLhbaOidList", "IMA_GetLhbaProperties", "IMA_TSR_GetRouteOidList",
                          "IMA_TSR_GetRouteProperties", "IMA_TSR_GetNetworkPortalOidList",
                          "IMA_GetNetworkPortalProperties", "IMA_TSR_GetLnpProperties",
                          "IMA_TSR_DisassociateRoute", "IMA_TSR_RemoveRoute"));
  EXPECT_EQ(List(host, "-A hba0").result.size(), 2u);
  EXPECT_THAT(Remove(host, entry).messages, ElementsAre("Unable to find route."));
  // One whose portal the adapter does not have.
  EXPECT_THAT(Remove(host, "-A hba1 -s default -g 192.0.2.1 -n ''").messages,
              ElementsAre("Unable to find network portal."));
}

}  // namespace
}  // namespace TessaroCli::IscsiNamespace

// The network that adapters see: discovery, logins and their outcomes, what is negotiated, and ways out.
#include "host/Host.h"
#include "host/Negotiation.h"
#include "simulator/Description.h"
#include "simulator/Simulator.h"
#include "support/Harness.h"

namespace {

using host::Demand;
using nlohmann::json;
using testing::ElementsAre;
using testing::IsEmpty;
using Texts = std::vector<std::string>;

constexpr char kFailedLogins[] = "Discovery Completed, Some iSCSI Targets failed to login.";

/// An adapter "a" with all that it may need, with @p adapter, keys of its record, merged in, on a host with
/// the keys @p host.
std::string HostWith(const std::string& adapter, const std::string& host = "{}") {
  json one = {{"name", "a"},
              {"initiatorName", "iqn.2026-11.org.example:host"},
              {"network", {{"ipv4Address", "192.0.2.100"}}},
              {"capabilities",
               {{"Static Discovery Settable", true},
                {"Sendtarget Discovery Settable", true},
                {"CHAP Authorization Supported", true},
                {"Mutual Authentication Supported", true},
                {"Target Level Authentication Supported", true}}}};
  one.merge_patch(json::parse(adapter));
  json all = json::parse(host);
  all["adapters"] = json::array({one});
  return all.dump();
}

/// The same with a static target "t" at 192.0.2.1, which @p target, keys of its record, makes what it is.
std::string TargetWith(const std::string& target, const std::string& adapter = "{}",
                       const std::string& portals = "[]") {
  json remote = {{"name", "t"}, {"portals", json::array({{{"host", "192.0.2.1"}, {"tag", 7}}})}};
  remote.merge_patch(json::parse(target));
  json patch = {{"staticTargets", json::array({{{"name", "t"}, {"host", "192.0.2.1"}}})}};
  patch.merge_patch(json::parse(adapter));
  return HostWith(
      patch.dump(),
      json({{"remoteTargets", json::array({remote})}, {"remotePortals", json::parse(portals)}}).dump());
}

Texts Targets(Harness& host) { return host("iscsi adapter target list").Column("Target"); }
Texts Errors(Harness& host) { return host("iscsi adapter target list").Column("Last Error"); }
Texts Methods(Harness& host) { return host("iscsi adapter target list").Column("Discovery Method"); }
Texts SessionTargets(Harness& host) { return host("iscsi session list").Column("Target"); }

/// The status of a discovery of the adapter.
std::string Rediscover(Harness& host) {
  EXPECT_EQ(host("iscsi adapter discovery rediscover -A a").result, "Rediscovery started");
  return host("iscsi adapter discovery status get -A a").result;
}

/// Changes the description of the host as @p change says, a JSON merge patch of its top keys.
void Alter(const Harness& host, const json& change) {
  json description = host.Show();
  description.merge_patch(change);
  simulator::Load(description.dump());
}

TEST(Network, EachOutcomeOfALoginShowsAsItself) {
  const struct {
    const char* error;
    const char* target;
    const char* portals = "[]";
    const char* adapter = "{}";
  } cases[] = {
      {"0x0200 Miscellaneous iSCSI initiator errors.", R"({"status": 512})"},
      {"0x0202 Initiator is not allowed access to the given target.",
       R"({"refusedInitiators": ["x", "iqn.2026-11.org.example:host"]})"},
      {"0x0203 Requested ITN does not exist at this address.", R"({"name": "other"})"},
      {"0x0207 Missing parameters (e.g., iSCSI initiator and/or target name).", "{}", "[]",
       R"({"initiatorName": ""})"},
      {"0x0301 iSCSI service or target is not currently operational.", "{}",
       R"([{"host": "192.0.2.1", "status": 769}])"},
      {"Unqualified Login Status. (Error=0x10000)", "{}", R"([{"host": "192.0.2.1", "answers": false}])"},
      {"Unqualified Login Status. (Error=0x10000)", R"({"portals": []})"},
      {"Unqualified Login Status. (Error=0x20000)", "{}", "[]", R"({"kind": "software"})"},
      {"Unqualified Login Status. (Error=0x60203)", R"({"parameters": {"dataDigest": "required"}})"},
      {"0x0101 Requested ITN has moved temporarily to the address provided.", "{}",
       R"([{"host": "192.0.2.1", "redirect": {"host": "192.0.2.1"}}])"},
      {"0x0102 Requested ITN has moved permanently to the address provided.", "{}",
       R"([{"host": "192.0.2.1", "redirect": {"host": "b", "permanent": true}},
           {"host": "b", "redirect": {"host": "192.0.2.1", "permanent": true}}])"},
  };
  for (const auto& c : cases) {
    Harness host(TargetWith(c.target, c.adapter, c.portals));
    EXPECT_EQ(host("iscsi session add -A a -n t").status, 1) << c.error;
    EXPECT_THAT(Errors(host), ElementsAre(c.error)) << c.target << c.portals;
    EXPECT_THAT(SessionTargets(host), IsEmpty()) << c.error;
    EXPECT_EQ(Rediscover(host), kFailedLogins) << c.error;
  }
}

TEST(Network, ChapIsDoneAsBothSidesWish) {
  const char* in = "No Error";
  const char* refused = "0x0201 Initiator could not be successfully authenticated.";
  const char* unproven = "Unqualified Login Status. (Error=0x60201)";
  const char* without = "Unqualified Login Status. (Error=0x60202)";
  const struct {
    const char* level;
    const char* secret;
    const char* demand;
    const char* outcome;
    const char* method;  // of the session
    const char* mutual = "prohibited";
    const char* mutualSecret = "back";
    const char* targetName = "target";
  } cases[] = {
      {"prohibited", "right", "required", refused, ""},
      {"discouraged", "wrong", "preferred", in, "none"},
      {"preferred", "right", "discouraged", in, "chap"},
      {"required", "right", "prohibited", without, ""},
      {"required", "wrong", "required", refused, ""},
      {"required", "right", "required", in, "chap", "required"},
      {"required", "right", "required", unproven, "", "preferred", "wrong"},
      {"required", "right", "required", in, "chap", "discouraged", "wrong"},
      {"required", "right", "required", unproven, "", "required", "back", ""},
      {"required", "right", "required", in, "chap", "preferred", "back", ""},
      {"preferred", "right", "prohibited", unproven, "", "required"},
      {"preferred", "right", "prohibited", in, "none", "preferred", "wrong"},
  };
  for (const auto& c : cases) {
    const json target = {{"chap",
                          {{"level", c.demand},
                           {"name", "me"},
                           {"secret", "right"},
                           {"mutualName", c.targetName},
                           {"mutualSecret", "back"}}}};
    const json adapter = {
        {"chap",
         {{"uni", {{"name", "me"}, {"secret", c.secret}, {"level", c.level}}},
          {"mutual", {{"name", "target"}, {"secret", c.mutualSecret}, {"level", c.mutual}}}}}};
    Harness host(TargetWith(target.dump(), adapter.dump()));
    SCOPED_TRACE(adapter.dump() + target.dump());
    host("iscsi session add -A a");
    EXPECT_THAT(Errors(host), ElementsAre(c.outcome));
    const Texts methods = host("iscsi session list").Column("AuthenticationMethod");
    EXPECT_EQ(methods, *c.method == 0 ? Texts{} : Texts{c.method});
  }
}

TEST(Network, TheChapEntryThatHoldsIsTheNextOne) {
  const std::string right = R"({"uni": {"name": "me", "secret": "right", "level": "required"}})";
  const std::string wrong = R"({"uni": {"name": "me", "secret": "wrong", "level": "required"}})";
  const std::string aside =
      R"({"uni": {"name": "x", "secret": "x", "level": "required", "inherited": true}})";
  const struct {
    std::string portal, sendTarget, adapter;
    bool isIn;
  } cases[] = {{"{}", "{}", right, true},    {"{}", right, wrong, true},  {right, wrong, wrong, true},
               {wrong, right, right, false}, {"{}", wrong, right, false}, {aside, right, wrong, true},
               {aside, aside, right, true}};
  for (const auto& c : cases) {
    Harness host(HostWith(
        R"({"chap": )" + c.adapter + R"(, "sendTargets": [{"host": "192.0.2.1", "chap": )" + c.sendTarget +
            R"(}], "staticTargets": [{"name": "t", "host": "192.0.2.1", "sendTarget": {"host": "192.0.2.1"},
                                      "chap": )" +
            c.portal + "}]}",
        R"({"remoteTargets": [{"name": "t", "portals": [{"host": "192.0.2.1"}],
            "chap": {"level": "required", "name": "me", "secret": "right"}}]})"));
    EXPECT_EQ(host("iscsi session add -A a").result == true, c.isIn) << c.portal << c.sendTarget << c.adapter;
  }
}

TEST(Network, RulesOfNegotiation) {
  using P = host::OperationalParameters;
  const struct {
    std::uint32_t P::*value;
    std::uint32_t one, other, result;  // whichever side brings which
  } cases[] = {
      {&P::maxConnections, 1, 4, 1},          {&P::initialR2T, 0, 1, 1},
      {&P::immediateData, 1, 0, 0},           {&P::maxBurstLength, 70000, 65536, 65536},
      {&P::firstBurstLength, 512, 4096, 512}, {&P::firstBurstLength, 16777215, 16777215, 262144},
      {&P::defaultTime2Wait, 2, 5, 5},        {&P::defaultTime2Retain, 20, 0, 0},
      {&P::maxOutstandingR2T, 8, 3, 3},       {&P::dataPduInOrder, 1, 0, 1},
      {&P::dataSequenceInOrder, 0, 1, 1},     {&P::errorRecoveryLevel, 2, 1, 1},
  };
  for (const auto& c : cases) {
    P one, other;
    one.*c.value = c.one;
    other.*c.value = c.other;
    EXPECT_EQ(host::Negotiate(one, other)->values.*c.value, c.result) << &c - cases;
    EXPECT_EQ(host::Negotiate(other, one)->values.*c.value, c.result) << &c - cases;
  }
  const char* chosen[] = {"nnn-", "nnnd", "nddd", "-ddd"};  // a row for each level of the initiator
  for (int own = 0; own < 4; ++own) {
    for (int theirs = 0; theirs < 4; ++theirs) {
      const auto done = host::Choose(static_cast<Demand>(own), static_cast<Demand>(theirs));
      EXPECT_EQ(!done ? '-' : *done ? 'd' : 'n', chosen[own][theirs]) << own << theirs;
    }
  }
}

TEST(Network, SessionsShowWhatBothSidesBrought) {
  Harness host(TargetWith(
      R"({"parameters": {"maxRecvDataSegmentLength": 65536, "maxBurstLength": 4096, "defaultTime2Wait": 9,
                         "initialR2T": false, "headerDigest": "required", "dataDigest": "preferred"}})",
      R"({"parameters": {"MaxRecvDataSegment": {"current": 1024}, "InitialR2T": {"current": false},
                         "ImmediateData": {"current": false, "supported": false},
                         "HeaderDigest": "discouraged"}})"));
  ASSERT_EQ(host("iscsi session add -A a").result, true);
  // The adapter has no ImmediateData, which is at its standard value therefore.
  const std::pair<const char*, const char*> shown[] = {
      {"iscsi session list", R"({"MaxBurstLength": 4096, "FirstBurstLength": "4096", "DefaultTime2Wait": 9,
                                 "InitialR2T": false, "ImmediateData": true, "TargetPortalGroupTag": 7})"},
      {"iscsi session connection list",
       R"({"MaxRecvDataSegmentLength": 1024, "MaxTransmitDataSegmentLength": 65536, "HeaderDigest": "CRC32C",
           "DataDigest": "NONE", "LocalAddress": "192.0.2.100"})"}};
  for (const auto& [list, fields] : shown) {
    const json row = host(list).result[0];
    json expected = row;
    expected.update(json::parse(fields));
    EXPECT_EQ(row, expected);
  }
}

constexpr char kSendTarget[] = R"({"sendTargets": [{"host": "192.0.2.1"}]})";
constexpr char kTwoTargets[] = R"({"remoteTargets": [
    {"name": "t0", "alias": "zero", "portals": [{"host": "192.0.2.1", "tag": 2}, {"host": "192.0.2.2", "port": 860}]},
    {"name": "t1", "portals": [{"host": "192.0.2.1"}]}]})";

TEST(Network, ALoginTellsAliasAndPortalGroup) {
  Harness host(TargetWith(R"({"alias": "disk"})"));
  EXPECT_EQ(host("iscsi session add -A a").result, true);
  EXPECT_THAT(host("iscsi adapter target list").Column("Alias"), ElementsAre("disk"));
  EXPECT_THAT(host("iscsi adapter discovery statictarget list").Column("TPGT"), ElementsAre("7"));
}

TEST(Rediscovery, TargetsComeAndGoAndSettingsStay) {
  Harness host(HostWith(kSendTarget, kTwoTargets));
  EXPECT_THAT(Targets(host), IsEmpty());
  EXPECT_EQ(Rediscover(host), "Discovery Completed");
  EXPECT_THAT(Targets(host), ElementsAre("t0", "t1"));
  EXPECT_THAT(host("iscsi adapter target list").Column("Alias"), ElementsAre("zero", ""));
  EXPECT_THAT(Methods(host), ElementsAre("SENDTARGETS ", "SENDTARGETS "));
  EXPECT_THAT(host("iscsi adapter target portal list -n t0").Column("Port"), ElementsAre("3260", "860"));
  EXPECT_THAT(host("iscsi adapter target portal list -n t0").Column("Tpgt"), ElementsAre("2", "1"));
  EXPECT_THAT(SessionTargets(host), ElementsAre("t0", "t1"));
  const json once = host.Show();
  Rediscover(host);
  EXPECT_EQ(host.Show(), once);

  // What is set on a portal and on the sendtarget stays; t0 goes for want of a session, t1 stays for its own.
  const std::string place = " -A a -n t1 -a 192.0.2.1";
  ASSERT_EQ(host("iscsi adapter target portal param set -k LoginTimeout -v 9" + place).result, true);
  ASSERT_EQ(host("iscsi adapter target portal auth chap set -d uni -N n -S s -l preferred" + place).result,
            true);
  ASSERT_EQ(host("iscsi session remove -A a -n t0").result, true);
  const json settings = host.Show("/adapters/0/staticTargets/2");
  Alter(host, {{"remoteTargets", json::array({{{"name", "t2"}, {"portals", {{{"host", "192.0.2.1"}}}}}})}});
  Rediscover(host);
  EXPECT_THAT(Targets(host), ElementsAre("t1", "t2"));
  EXPECT_EQ(host.Show("/adapters/0/staticTargets/0"), settings);
  Alter(host, json::parse(kTwoTargets));
  Rediscover(host);
  EXPECT_EQ(host.Show("/adapters/0/staticTargets/0"), settings);

  // Without the sendtarget nobody tells of them.
  host("iscsi session remove -A a");
  host("iscsi adapter discovery sendtarget remove -A a -a 192.0.2.1");
  Rediscover(host);
  EXPECT_THAT(Targets(host), IsEmpty());
}

TEST(Rediscovery, StaticTargetsAreFoundBesides) {
  Harness host(HostWith(
      R"({"sendTargets": [{"host": "192.0.2.1"}], "staticTargets": [{"name": "t1", "host": "192.0.2.1", "boot": true}]})",
      kTwoTargets));
  Rediscover(host);
  EXPECT_THAT(Targets(host), ElementsAre("t1", "t0"));
  EXPECT_THAT(Methods(host), ElementsAre("STATIC SENDTARGETS ", "SENDTARGETS "));
  EXPECT_EQ(host("iscsi adapter discovery statictarget list").result.size(), 1u);
  host("iscsi session remove -A a");
  Alter(host, {{"remoteTargets", json::array()}, {"remotePortals", {{{"host", "192.0.2.1"}}}}});
  EXPECT_EQ(Rediscover(host), kFailedLogins);
  EXPECT_THAT(Methods(host), ElementsAre("STATIC "));
  ASSERT_EQ(host("iscsi adapter discovery statictarget remove -A a -n t1 -a 192.0.2.1").result, true);
  EXPECT_THAT(Targets(host), IsEmpty());
}

TEST(Rediscovery, ATargetThatNothingLeadsToGoes) {
  // With its session, where it has one; of the others what has addresses of its own stays.
  Harness host(
      HostWith(R"({"sendTargets": [{"host": "192.0.2.1"}],
                   "staticTargets": [{"name": "t1", "host": "192.0.2.1"},
                                     {"name": "t9", "host": "192.0.2.9", "sendTarget": {"host": "192.0.2.1"}}],
                   "targets": [{"name": "bare"}, {"name": "own", "addresses": [{"address": "192.0.2.1"}]}]})",
               R"({"remoteTargets": [{"name": "t1", "reported": false, "portals": [{"host": "192.0.2.1"}]},
                                     {"name": "own", "reported": false, "portals": [{"host": "192.0.2.1"}]}]})"));
  EXPECT_EQ(Rediscover(host), "Discovery Completed");
  EXPECT_THAT(Targets(host), ElementsAre("own", "t1"));
  for (const char* name : {"t1", "own"})
    EXPECT_EQ(host(std::string("iscsi session remove -A a -n ") + name).result, true);
  EXPECT_THAT(Targets(host), ElementsAre("own", "t1"));
  Rediscover(host);
  ASSERT_EQ(host("iscsi adapter discovery statictarget remove -A a -n t1 -a 192.0.2.1").result, true);
  EXPECT_THAT(Targets(host), ElementsAre("own", "t1"));
  ASSERT_EQ(host("iscsi session remove -A a").result, true);
  EXPECT_THAT(Targets(host), ElementsAre("own"));
}

TEST(Rediscovery, HostNamesAreTheSameInEachSpelling) {
  Harness host(HostWith(
      R"({"capabilities": {"DNS Based Address Supported": true}, "sendTargets": [{"host": "Portal"}]})",
      R"({"remoteTargets": [{"name": "t", "portals": [{"host": "pORTAL"}]}],
                            "remotePortals": [{"host": "PORTAL", "chap": {"level": "required"}}]})"));
  const std::string list = "iscsi adapter discovery sendtarget ";
  EXPECT_EQ(host(list + "add -A a -a portal").messages.at(0),
            "The adapter a has the sendtarget portal:3260 already.");
  EXPECT_EQ(Rediscover(host), kFailedLogins);  // that portal wants CHAP
  Alter(host, {{"remotePortals", nullptr}});
  EXPECT_EQ(Rediscover(host), "Discovery Completed");
  EXPECT_THAT(Targets(host), ElementsAre("t"));
  EXPECT_EQ(host("iscsi adapter target portal param get -A a -n t -a portal").result.size(), 19u);
  EXPECT_THAT(host(list + "list").Column("Sendtarget"), ElementsAre("Portal:3260"));
  EXPECT_EQ(host(list + "remove -A a -a PORTAL").result, true);
}

TEST(Rediscovery, ChangesNothingThatHoldsForAStaticTarget) {
  Harness host(HostWith(R"({"parameters": {"MaxCmds": {"current": 32}},
      "sendTargets": [{"host": "192.0.2.1", "parameters": {"MaxCmds": 64}}],
      "staticTargets": [{"name": "t0", "host": "192.0.2.1"}]})",
                        kTwoTargets));
  Rediscover(host);
  EXPECT_THAT(Methods(host), ElementsAre("STATIC SENDTARGETS ", "SENDTARGETS "));
  for (const auto& [target, current] : {std::pair{"t0", "32"}, {"t1", "64"}}) {
    const std::string get =
        std::string("iscsi adapter target portal param get -A a -a 192.0.2.1 -n ") + target;
    json shown;
    for (const json& row : host(get).result) {
      if (row["Name"] == "MaxCmds") shown = row["Current"];
    }
    EXPECT_EQ(shown, current) << target;
  }
}

TEST(Rediscovery, APortalThatSeveralTellOfStaysWithItsOrigin) {
  Harness host(HostWith(
      R"({"sendTargets": [{"host": "192.0.2.1"}, {"host": "192.0.2.2"}],
      "staticTargets": [{"name": "t", "host": "192.0.2.1", "sendTarget": {"host": "192.0.2.2"}}]})",
      R"({"remoteTargets": [{"name": "t", "portals": [{"host": "192.0.2.1"}, {"host": "192.0.2.2"}]}]})"));
  const auto origins = [&] {
    Texts hosts;
    for (const json& place : host.Show("/adapters/0/staticTargets"))
      hosts.push_back(place["sendTarget"]["host"]);
    return hosts;
  };
  Rediscover(host);
  EXPECT_THAT(origins(), ElementsAre("192.0.2.2", "192.0.2.1"));  // of a new one, the first that tells of it
  host("iscsi adapter discovery sendtarget remove -A a -a 192.0.2.2");
  Rediscover(host);
  EXPECT_THAT(origins(), ElementsAre("192.0.2.1", "192.0.2.1"));
}

TEST(Rediscovery, ASessionThatNoPortalLeadsToIsNoFailedLogin) {
  Harness host(HostWith(R"({"kind": "dependent", "networkPortals": [{"nic": "n1"}],
                            "staticTargets": [{"name": "t0", "host": "192.0.2.1"}]})",
                        R"({"nics": [{"name": "n1"}, {"name": "n2"}],
                            "remoteTargets": [{"name": "t0", "portals": [{"host": "192.0.2.1"}]}]})"));
  EXPECT_EQ(host("iscsi session add -A a").result, true);
  EXPECT_EQ(host("iscsi adapter discovery statictarget remove -A a -n t0 -a 192.0.2.1").result, true);
  EXPECT_EQ(host("iscsi networkportal add -A a -n n2").result, true);
  EXPECT_EQ(Rediscover(host), "Discovery Completed");
  EXPECT_THAT(SessionTargets(host), ElementsAre("t0"));
}

TEST(Rediscovery, PassesOverPortalsThatTheAdapterCannotBeGiven) {
  constexpr char kForms[] = R"({"remoteTargets": [
      {"name": "t0", "portals": [{"host": "192.0.2.1"}, {"host": "2001:db8::1"}, {"host": "portal.example"}]}]})";
  const std::tuple<const char*, Texts> cases[] = {
      {"{}", {"192.0.2.1"}},
      {R"({"IPv6 Supported": true})", {"192.0.2.1", "2001:db8::1"}},
      {R"({"DNS Based Address Supported": true})", {"192.0.2.1", "portal.example"}},
  };
  for (const auto& [capabilities, shown] : cases) {
    Harness host(HostWith(
        R"({"sendTargets": [{"host": "192.0.2.1"}], "capabilities": )" + std::string(capabilities) + '}',
        kForms));
    Rediscover(host);
    Texts hosts;
    for (const json& place : host.Show("/adapters/0/staticTargets")) hosts.push_back(place["host"]);
    EXPECT_EQ(hosts, shown) << capabilities;
  }
}

TEST(Rediscovery, TheStatusTellsWhatPortalsDid) {
  const struct {
    const char* portal;  // what 192.0.2.1 does
    const char* status;
    std::size_t targets;  // of one that was found before and one that is new
  } cases[] = {
      {R"("answers": true)", "Discovery Completed", 2},
      {R"("answers": false)", "Discovery Timeout", 1},
      {R"("redirect": {"host": "192.0.2.2", "port": 860})", "Discovery Completed", 1},
      {R"("redirect": {"host": "192.0.2.1"})", kFailedLogins, 1},
      {R"("redirect": {"host": "nowhere", "permanent": true})", "Discovery Timeout", 1},
  };
  for (const auto& c : cases) {
    json network = json::parse(kTwoTargets);
    network["remotePortals"] =
        json::array({json::parse(R"({"host": "192.0.2.1", )" + std::string(c.portal) + '}')});
    Harness host(HostWith(R"({"sendTargets": [{"host": "192.0.2.1"}], "staticTargets": [
                              {"name": "t0", "host": "192.0.2.2", "port": 860, "sendTarget": {"host": "192.0.2.1"}}]})",
                          network.dump()));
    EXPECT_EQ(Rediscover(host), c.status) << c.portal;
    EXPECT_EQ(Targets(host).size(), c.targets) << c.portal;
  }
  Harness cut(HostWith(R"({"kind": "software", "sendTargets": [{"host": "192.0.2.1"}]})", kTwoTargets));
  EXPECT_EQ(Rediscover(cut), "Discovery Timeout");
}

TEST(Paths, LeadToTheFamiliesOfTheirAddresses) {
  const struct {
    const char* network;
    bool ipv4, ipv6, name;  // whether portals with such an address are reached
  } cases[] = {
      {R"({})", true, false, true},
      {R"({"ipv4Enabled": false, "ipv6Enabled": true})", false, false, false},
      {R"({"ipv4Address": null, "ipv6Addresses": [{"address": "2001:db8::100"}], "ipv6Enabled": true})",
       false, true, true},
      {R"({"ipv4Address": null, "ipv6Addresses": [{"address": "2001:db8::100"}]})", false, false, false},
      {R"({"ipv4Address": null, "ipv4Enabled": false, "ipv6Enabled": true})", false, true, true},
      {R"({"ipv6Addresses": [{"address": "2001:db8::100"}], "ipv6Enabled": true})", true, true, true},
  };
  for (const auto& c : cases) {
    const std::pair<const char*, bool> portals[] = {
        {"192.0.2.1", c.ipv4}, {"2001:db8::1", c.ipv6}, {"array", c.name}};
    for (const auto& [portal, isReached] : portals) {
      const json at = {{{"host", portal}}};
      const json adapter = {{"network", json::parse(c.network)},
                            {"sendTargets", at},
                            {"staticTargets", {{{"name", "t"}, {"host", portal}}}}};
      const json remote = {{"remoteTargets", {{{"name", "t"}, {"portals", at}}}}};
      Harness host(HostWith(adapter.dump(), remote.dump()));
      EXPECT_EQ(Rediscover(host), isReached ? "Discovery Completed" : "Discovery Timeout")
          << c.network << portal;
      EXPECT_EQ(SessionTargets(host).size(), isReached ? 1u : 0u) << c.network << portal;
    }
  }
}

TEST(Paths, EachBoundNicCarriesASession) {
  Harness host(HostWith(R"({"kind": "software", "staticTargets": [{"name": "t", "host": "192.0.2.9"}],
                            "networkPortals": [{"nic": "n0"}]})",
                        R"({"remotePortals": [{"host": "192.0.2.9", "redirect": {"host": "192.0.2.1"}}],
                            "remoteTargets": [{"name": "t", "portals": [{"host": "192.0.2.1"}], "maxSessions": 3}],
                            "nics": [{"name": "n0", "ipv4Address": "198.51.100.1"},
                                     {"name": "n1", "ipv4Address": "198.51.100.2"},
                                     {"name": "down", "ipv4Address": "198.51.100.3", "linkUp": false}]})"));
  const auto paths = [&] { return host("iscsi session connection list").Column("LocalAddress"); };
  ASSERT_EQ(host("iscsi session add -A a").result, true);
  EXPECT_THAT(paths(), ElementsAre("198.51.100.1"));
  EXPECT_THAT(host("iscsi session connection list").Column("ConnectionAddress"), ElementsAre("192.0.2.9"));
  // Where it was sent on to.
  EXPECT_THAT(host("iscsi session connection list").Column("RemoteAddress"), ElementsAre("192.0.2.1"));

  ASSERT_EQ(host("iscsi networkportal add -A a -n n1").result, true);
  ASSERT_EQ(host("iscsi session add -A a").result, true);
  ASSERT_EQ(host("iscsi session add -A a").result, true);  // nothing is missing any more
  EXPECT_THAT(paths(), ElementsAre("198.51.100.1", "198.51.100.2"));
  EXPECT_EQ(host.Show("/adapters/0/targets/0/sessions/1/portal"), "n1");
  const std::string isid = host("iscsi session list").result[1]["ISID"];
  ASSERT_EQ(host("iscsi session add -A a -n t -s " + isid).result, true);
  EXPECT_THAT(paths(), ElementsAre("198.51.100.1", "198.51.100.2", "198.51.100.2"));
  EXPECT_THAT(host("iscsi session add -A a -n t").messages, ElementsAre("Failed to add session."));
  EXPECT_THAT(Errors(host),
              ElementsAre("0x0302 Target has insufficient session, connection or other resources."));
  host("iscsi session remove -A a");
  ASSERT_EQ(host("iscsi networkportal add -A a -n down").result, true);
  EXPECT_EQ(host("iscsi session add -A a").status, 1);  // that way there is no answer
  EXPECT_THAT(paths(), ElementsAre("198.51.100.1", "198.51.100.2"));
  EXPECT_THAT(Errors(host), ElementsAre("Unqualified Login Status. (Error=0x10000)"));

  // The answer by one way tells more than the silence on another.
  Alter(host, {{"remoteTargets",
                json::parse(R"([{"name": "t", "status": 516, "portals": [{"host": "192.0.2.1"}]}])")}});
  host("iscsi session remove -A a");
  for (const std::string nic : {"n1", "n0"}) {  // which goes behind the others
    host("iscsi networkportal remove -A a -n " + nic);
    ASSERT_EQ(host("iscsi networkportal add -A a -n " + nic).result, true);
    EXPECT_EQ(host("iscsi session add -A a").status, 1);
    EXPECT_THAT(Errors(host),
                ElementsAre("0x0204 Requested ITN has been removed and no forwarding address is provided."))
        << nic;
  }
}

TEST(DemoHost, IsAsIfItHadBeenRunning) {
  Harness host{std::string(simulator::DemoDescription())};
  const json before = host.Show();
  for (const char* adapter : {"hba0", "hba1", "hba2"}) {
    host(std::string("iscsi adapter discovery rediscover -A ") + adapter);
  }
  EXPECT_EQ(host.Show(), before);
}

}  // namespace

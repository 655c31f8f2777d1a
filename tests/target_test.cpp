// iscsi adapter target list and portal list: what they show of targets, and how the host comes to know them.
#include "IscsiUtil/Ima.h"
#include "support/Harness.h"

namespace {

using testing::Each;
using testing::ElementsAre;
using testing::IsEmpty;

constexpr char kHost[] = R"({"adapters": [
  {"name": "hba0", "targets": [
    {"name": "iqn.2026-11.org.example:one", "alias": "one", "discoveryMethods": ["static", "sendtargets"],
     "sendTargetsDiscoverySettable": true, "loginStatus": 328193,
     "addresses": [{"address": "192.0.2.1", "port": 860, "tag": 65535},
                   {"address": "2001:db8::1", "portAndTagPresent": 0},
                   {"address": "192.0.2.2", "portAndTagPresent": 2}]},
    {"name": "iqn.2026-11.org.example:two"}]},
  {"name": "hba1", "targets": [{"name": "iqn.2026-11.org.example:one"}],
   "staticTargets": [{"name": "iqn.2026-11.org.example:three", "host": "198.51.100.3", "portalGroup": 7},
                     {"name": "iqn.2026-11.org.example:three", "host": "storage.example.org"},
                     {"name": "iqn.2026-11.org.example:three", "host": "2001:db8::3", "sendTarget": {"host": "x"}},
                     {"name": "iqn.2026-11.org.example:one", "host": "192.0.2.1"}]},
  {"name": "disk0", "kind": "scsi"}]})";

std::vector<std::string> Values(const nlohmann::json& list, const char* field) {
  std::vector<std::string> values;
  for (const auto& row : list) values.push_back(row.at(field).get<std::string>());
  return values;
}

TEST(TargetList, ShowsEveryTargetOfEveryAdapter) {
  Harness host(kHost);
  const Outcome run = host("iscsi adapter target list");
  EXPECT_EQ(run.result[3]["ID"], "hba1,iqn.2026-11.org.example:three");
  EXPECT_EQ(run.result[0], nlohmann::json::parse(R"({
      "ID": "hba0,iqn.2026-11.org.example:one", "Adapter": "hba0", "Target": "iqn.2026-11.org.example:one",
      "Alias": "one", "Discovery Method": "STATIC SENDTARGETS ", "SendTargets Discovery Settable": true,
      "SendTargets Discovery Enabled": false,
      "Last Error": "0x0201 Initiator could not be successfully authenticated."})"));
  EXPECT_THAT(Values(run.result, "Discovery Method"),
              ElementsAre("STATIC SENDTARGETS ", "", "STATIC ", "STATIC SENDTARGETS "));
}

TEST(TargetList, FiltersAreExactAndKeepTheRestUnread) {
  Harness host(kHost);
  const Outcome one = host("iscsi adapter target list -A hba1 -n iqn.2026-11.org.example:three");
  EXPECT_THAT(Values(one.result, "Target"), ElementsAre("iqn.2026-11.org.example:three"));
  EXPECT_THAT(one.Calls(), ElementsAre("IMA_GetLhbaOidList", "IMA_GetLhbaProperties", "IMA_GetLhbaProperties",
                                       "IMA_GetTargetOidList", "IMA_GetTargetProperties",
                                       "IMA_GetTargetProperties", "IMA_TSR_GetInternalConfigData"));
  for (const char* command : {"iscsi adapter target list ", "iscsi adapter target portal list "}) {
    for (const char* options : {"-A ''", "-n iqn.2026-11.org.example:ONE"}) {
      EXPECT_EQ(host(std::string(command) + options).result, nlohmann::json::array()) << options;
    }
  }
}

TEST(TargetList, LastErrorTellsSourceClassAndDetail) {
  const std::map<std::uint32_t, std::string> words = {
      {0x00000201, "No Error"},
      {0x00050000, "0x0000 Login is proceeding okay."},
      {0x0005020a, "0x020A Attempt to add a connection to a nonexistent session."},
      {0x0005ffff, "Unqualified Login Status. (Error=0x5ffff)"},
      {0x00060201, "Unqualified Login Status. (Error=0x60201)"},
      {0xffffffff, "Unqualified Login Status. (Error=0xffffffff)"},
  };
  for (const auto& [word, text] : words) {
    nlohmann::json description = nlohmann::json::parse(kHost);
    description["adapters"][0]["targets"][0]["loginStatus"] = word;
    EXPECT_EQ(Harness(description.dump())("iscsi adapter target list").result[0]["Last Error"], text);
  }
  Harness unreadable(WithAnswers(kHost, R"({"operation": "IMA_TSR_GetInternalConfigData", "imaStatus": 1})"));
  const Outcome run = unreadable("iscsi adapter target list");
  EXPECT_THAT(Values(run.result, "Last Error"), ElementsAre("na", "na", "na", "na"));
}

TEST(TargetPortalList, ShowsAddressesOfItsOwnAndOfPortals) {
  const nlohmann::json rows = Harness(kHost)("iscsi adapter target portal list").result;
  EXPECT_THAT(Values(rows, "IP"), ElementsAre("192.0.2.1", "2001:db8::1", "192.0.2.2", "192.0.2.1",
                                              "198.51.100.3", "2001:db8::3"));
  EXPECT_THAT(Values(rows, "Port"), ElementsAre("860", "na", "na", "na", "3260", "na"));
  EXPECT_THAT(Values(rows, "Tpgt"), ElementsAre("65535", "na", "na", "na", "7", "na"));
}

TEST(TargetLists, AnyOtherFailureEndsThem) {
  Harness host(
      WithAnswers(kHost, R"({"operation": "IMA_GetTargetOidList", "adapter": "hba1", "imaStatus": 1})"));
  for (const char* line : {"iscsi adapter target list", "iscsi adapter target portal list"}) {
    EXPECT_THAT(host(line).messages, ElementsAre("Unable to get target list.")) << line;
  }
}

TEST(Names, AreCutAt223BytesInAnyLocale) {
  const std::string prefix = "iqn.2026-11.org.example:";
  const std::string whole = prefix + std::string(223 - prefix.size(), 'x');
  std::string wide = prefix;  // 223 characters of which most take two bytes
  for (std::size_t i = prefix.size(); i < 223; ++i) wide += "é";
  const std::string adapter = std::string(230, 'a');
  const nlohmann::json description = {
      {"adapters", {{{"name", adapter}, {"targets", {{{"name", whole}}, {{"name", wide}}}}}}}};
  for (const char* locale : {"C", "C.UTF-8"}) {
    ASSERT_NE(setlocale(LC_CTYPE, locale), nullptr);
    Harness host(description.dump());
    const std::string shownAdapter = adapter.substr(0, 223);
    // 24 bytes ASCII and 99 characters of two bytes are 222: half a character does not follow.
    const std::string shownWide = wide.substr(0, 222);
    const nlohmann::json rows = host("iscsi adapter target list -A " + shownAdapter).result;
    EXPECT_THAT(Values(rows, "Target"), ElementsAre(whole, shownWide)) << locale;
    EXPECT_THAT(Values(rows, "Adapter"), Each(shownAdapter)) << locale;
    EXPECT_THAT(host("iscsi adapter target list -A " + adapter).result, IsEmpty()) << "the option is not cut";
    EXPECT_EQ(host("iscsi adapter target list -n " + shownWide).result.size(), 1u);
  }
  setlocale(LC_CTYPE, "C");
}

TEST(Names, OfOtherNumbersThanCharactersAreMarked) {
  using IscsiUtil::NarrowText;
  const IMA_WCHAR unterminated[] = {L'a', 0xd800, static_cast<IMA_WCHAR>(0x110000),
                                    static_cast<IMA_WCHAR>(-1), 0x10ffff};
  EXPECT_EQ(NarrowText(unterminated, 224), "a???\xf4\x8f\xbf\xbf");
  EXPECT_EQ(NarrowText(unterminated, 8), "a???");
  EXPECT_EQ(NarrowText({}, 224), "");
  EXPECT_EQ(IscsiUtil::CutText("abc", 4), "abc");
  EXPECT_EQ(IscsiUtil::CutText("abcd", 4), "abc");
  EXPECT_EQ(IscsiUtil::CutText("\xe2\x82\xac", 3), "");
}

}  // namespace

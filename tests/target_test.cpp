// iscsi adapter target list and portal list: what they show of targets, and how the host comes to know them.
#include "IscsiUtil/Ima.h"
#include "support/Harness.h"

namespace {

using testing::Each;
using testing::ElementsAre;
using testing::IsEmpty;

constexpr char kHost[] = R"({"adapters": [
  {"name": "hba0", "targets": [
    {"name": "iqn.2026-11.org.example:one", "discoveryMethods": ["static", "sendtargets"],
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

TEST(TargetList, ShowsEveryTargetOfEveryAdapter) {
  Harness host(kHost);
  const Outcome run = host("iscsi adapter target list");
  EXPECT_EQ(run.result[3]["ID"], "hba1,iqn.2026-11.org.example:three");
  EXPECT_THAT(run.Column("Discovery Method"),
              ElementsAre("STATIC SENDTARGETS ", "", "STATIC ", "STATIC SENDTARGETS "));
}

TEST(TargetList, FiltersAreExact) {
  Harness host(kHost);
  const Outcome one = host("iscsi adapter target list -A hba1 -n iqn.2026-11.org.example:three");
  EXPECT_THAT(one.Column("Target"), ElementsAre("iqn.2026-11.org.example:three"));
  for (const char* command : {"iscsi adapter target list ", "iscsi adapter target portal list "}) {
    for (const char* options : {"-A ''", "-n iqn.2026-11.org.example:ONE"}) {
      EXPECT_EQ(host(std::string(command) + options).result, nlohmann::json::array()) << options;
    }
  }
}

TEST(TargetList, LastErrorTellsSourceClassAndDetail) {
  std::map<std::uint32_t, std::string> words = {
      {0x00000201, "No Error"},
      {0x0005ffff, "Unqualified Login Status. (Error=0x5ffff)"},
      {0x00060201, "Unqualified Login Status. (Error=0x60201)"},
      {0xffffffff, "Unqualified Login Status. (Error=0xffffffff)"},
  };
  for (const std::string text :
       {"0x0000 Login is proceeding okay.",
        "0x0101 Requested ITN has moved temporarily to the address provided.",
        "0x0102 Requested ITN has moved permanently to the address provided.",
        "0x0200 Miscellaneous iSCSI initiator errors.",
        "0x0201 Initiator could not be successfully authenticated.",
        "0x0202 Initiator is not allowed access to the given target.",
        "0x0203 Requested ITN does not exist at this address.",
        "0x0204 Requested ITN has been removed and no forwarding address is provided.",
        "0x0205 Requested iSCSI version range is not supported by the target.",
        "0x0206 No more connections can be accepted on this Session ID (SSID).",
        "0x0207 Missing parameters (e.g., iSCSI initiator and/or target name).",
        "0x0208 Target does not support session spanning to this connection (address).",
        "0x0209 Target does not support this type of session or not from this initiator.",
        "0x020A Attempt to add a connection to a nonexistent session.",
        "0x020B Invalid request type during login.", "0x0300 Target hardware or software error.",
        "0x0301 iSCSI service or target is not currently operational.",
        "0x0302 Target has insufficient session, connection or other resources."}) {
    words[0x00050000 | static_cast<std::uint32_t>(std::stoul(text.substr(0, 6), nullptr, 16))] = text;
  }
  for (const auto& [word, text] : words) {
    nlohmann::json description = nlohmann::json::parse(kHost);
    description["adapters"][0]["targets"][0]["loginStatus"] = word;
    EXPECT_EQ(Harness(description.dump())("iscsi adapter target list").result[0]["Last Error"], text);
  }
  Harness unreadable(WithAnswers(kHost, R"({"operation": "IMA_TSR_GetInternalConfigData", "imaStatus": 1})"));
  const Outcome run = unreadable("iscsi adapter target list");
  EXPECT_THAT(run.Column("Last Error"), ElementsAre("na", "na", "na", "na"));
}

TEST(TargetPortalList, ShowsAddressesOfItsOwnAndOfPortals) {
  const Outcome rows = Harness(kHost)("iscsi adapter target portal list");
  EXPECT_THAT(rows.Column("IP"), ElementsAre("192.0.2.1", "2001:db8::1", "192.0.2.2", "192.0.2.1",
                                             "198.51.100.3", "2001:db8::3"));
  EXPECT_THAT(rows.Column("Port"), ElementsAre("860", "na", "na", "na", "3260", "na"));
  EXPECT_THAT(rows.Column("Tpgt"), ElementsAre("65535", "na", "na", "na", "7", "na"));
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
    const Outcome rows = host("iscsi adapter target list -A " + shownAdapter);
    EXPECT_THAT(rows.Column("Target"), ElementsAre(whole, shownWide)) << locale;
    EXPECT_THAT(rows.Column("Adapter"), Each(shownAdapter)) << locale;
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

// iscsi adapter list|get|set and capabilities get: what they show, what they refuse, and what they call. And
// what every command says of an adapter that is not there.
#include <map>

#include "support/Harness.h"
#include "support/SweepTable.h"

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr char kUnknownAdapter[] = "Invalid adapter specified or unable to get adapter.";

constexpr char kHost[] = R"({"adapters": [
  {"name": "hba0", "kind": "software"},
  {"name": "hba1", "kind": "independent", "state": 1, "capabilities": {"Name And Alias Settable": true}},
  {"name": "hba2", "kind": "dependent", "state": 2},
  {"name": "hba3", "kind": "dependent", "state": 9},
  {"name": "disk0", "kind": "scsi"}]})";

TEST(AdapterList, ShowsEveryIscsiAdapterOrTheOneNamed) {
  Harness host(kHost);
  const Outcome run = host("iscsi adapter list");
  ASSERT_EQ(run.result.size(), 4u);  // a plain storage adapter is none of them
  const char* states[] = {"online", "offline", "unbound", "unknown"};
  for (std::size_t i = 0; i < 4; ++i) EXPECT_EQ(run.result[i]["State"], states[i]);
  EXPECT_EQ(host("iscsi adapter list -A hba1").result.size(), 1u);
  EXPECT_THAT(host("iscsi adapter list -A ''").messages, ElementsAre(kUnknownAdapter));
}

TEST(AdapterSet, StoresNameAndAlias) {
  Harness host(kHost);
  EXPECT_EQ(host("iscsi adapter set -A hba1 -a lab -n iqn.2026-11.org.example:one").result, true);
  const nlohmann::json shown = host("iscsi adapter get -A hba1").result[0];
  EXPECT_EQ(shown["Name"], "iqn.2026-11.org.example:one");
  EXPECT_EQ(shown["Alias"], "lab");

  EXPECT_EQ(host("iscsi adapter set -A hba1 --alias=").result, true);
  EXPECT_EQ(host("iscsi adapter get -A hba1").result[0]["Alias"], "");
}

TEST(AdapterSet, InputIsTestedBeforeTheAdapterIsLookedUp) {
  Harness host(kHost);
  const std::pair<const char*, const char*> cases[] = {
      {"", "Invalid iscsi name or alias input. Make sure at least one of [--name] and [--alias] is given."},
      {" --name= --alias x", "Invalid iscsi name input."},
  };
  for (const auto& [options, message] : cases) {
    const Outcome run = host(std::string("iscsi adapter set -A nosuch") + options);
    EXPECT_THAT(run.messages, ElementsAre(message));
    EXPECT_THAT(run.trace, IsEmpty());
  }
}

TEST(Lookup, OfAnAdapterThatIsNotThere) {
  const std::map<std::string, sweep::Texts> others = {
      {"plugin list", {"Unable to find matching plugin."}},
      {"adapter firmware get", {"Invalid adapter provided."}},
      {"adapter firmware set", {"Invalid adapter provided."}},
      {"session add", {"Failed to find matching object."}},
      {"session remove", {"Failed to find matching object."}},
      // Lists without a row.
      {"adapter discovery statictarget list", {}},
      {"adapter target list", {}},
      {"adapter target portal list", {}},
      {"session list", {}},
      {"session connection list", {}},
      {"RouteList", {}},
  };
  Harness host(sweep::HostDescription());
  const nlohmann::json before = host.Show();
  for (const sweep::SweptCommand& command : sweep::Commands()) {
    const auto other = others.find(command.name);
    for (const std::string& line : sweep::Parts(command.lines)) {
      const std::size_t at = line.find("-A ");
      if (at == line.npos) continue;
      for (const char* name : {"nosuch", "IND", "in", "disk0"}) {  // the host has "ind", and a plain "disk0"
        std::string named = line;
        named.replace(at + 3, line.find(' ', at + 3) - at - 3, name);
        const Outcome run = command.make == nullptr ? host("iscsi " + command.name + ' ' + named)
                                                    : host(command.make(), named);
        EXPECT_EQ(run.messages, other == others.end() ? sweep::Texts{kUnknownAdapter} : other->second)
            << command.name << ' ' << named;
        EXPECT_EQ(run.closed, run.result.is_array());
      }
    }
  }
  EXPECT_EQ(host.Show(), before);
}

}  // namespace

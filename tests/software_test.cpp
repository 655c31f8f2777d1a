// iscsi software get|set: the switch, and the initiator name that goes with it.
#include <fstream>

#include "host/Host.h"
#include "simulator/Simulator.h"
#include "support/Harness.h"

namespace {

using testing::ElementsAre;

constexpr char kOff[] = R"({"softwareIscsi": {"enabled": false}})";

class Software : public testing::Test {
 protected:
  std::string NameFile() const { return root_.Read("etc/tessaro/coreiscsid/initiatorname.iscsi"); }

  TemporaryRoot root_;
};

TEST_F(Software, SwitchesOnAndStoresTheName) {
  Harness host(kOff);
  EXPECT_EQ(host("iscsi software get").result, false);
  const Outcome run = host("iscsi software set --enabled=true --name iqn.2026-11.org.example:host1");
  EXPECT_EQ(run.result, "Software iSCSI Enabled");
  EXPECT_THAT(run.Calls(), ElementsAre("CheckInitiatorName", "Parse", "Save", "EnableSoftwareiScsi"));
  EXPECT_EQ(NameFile(), "InitiatorName=iqn.2026-11.org.example:host1\n");
  EXPECT_EQ(host("iscsi software get").result, true);

  // Without a name the file is left alone, also where the software initiator is on already.
  EXPECT_THAT(host("iscsi software set -e yes").Calls(), ElementsAre("EnableSoftwareiScsi"));
  EXPECT_EQ(NameFile(), "InitiatorName=iqn.2026-11.org.example:host1\n");
}

TEST_F(Software, SwitchingOffTakesNoName) {
  Harness host(R"({"softwareIscsi": {"enabled": true}})");
  const Outcome refused = host("iscsi software set --enabled=false --name x");
  EXPECT_THAT(refused.messages,
              ElementsAre("-n|--name must not be specified when disabling software iSCSI."));
  EXPECT_TRUE(refused.trace.empty());
  const Outcome run = host("iscsi software set --enabled=no");
  EXPECT_EQ(run.result, "Software iSCSI Disabled. (Reboot Required)");
  EXPECT_TRUE(run.messages.empty() && run.closed);
}

TEST_F(Software, FailuresTellTheReasonAndChangeNothing) {
  Harness host(kOff);
  const Outcome run = host("iscsi software set --enabled=true --name nonsense");
  ASSERT_EQ(run.messages.size(), 1u);
  EXPECT_THAT(run.messages[0], testing::StartsWith("Failed to enable software iSCSI: "));
  EXPECT_THAT(run.messages[0], testing::HasSubstr("nonsense"));
  EXPECT_EQ(NameFile(), "");
  EXPECT_EQ(host("iscsi software get").result, false);
}

TEST_F(Software, ANameFileThatCannotBeLookedAtIsNotTakenForNone) {
  std::ofstream(root_.Path() + "/etc") << "no folder";
  Harness host(R"({"adapters": [{"name": "hba0", "kind": "software", "capabilities": {
      "Name And Alias Settable": true}}]})");
  EXPECT_EQ(host("iscsi adapter set -A hba0 -n iqn.2026-11.org.example:x").status, 1);
  EXPECT_THAT(host.trace.back(),
              testing::HasSubstr("initiatorname.iscsi cannot be opened: Not a directory."));
}

TEST_F(Software, TheNameGivenLastHoldsFromTheNextStartOn) {
  Harness host(
      R"({"adapters": [{"name": "hba0", "kind": "software", "initiatorName": "iqn.2026-11.org.example:old",
                                 "capabilities": {"Name And Alias Settable": true}}]})");
  const std::string set = "iscsi software set -e yes -n iqn.2026-11.org.example:";
  const std::string adapterSet = "iscsi adapter set -A hba0 -n iqn.2026-11.org.example:";
  const std::pair<std::string, const char*> steps[] = {
      {set + "x", "old"},
      {"reboot", "x"},
      {set + "x2", "x"},
      {"iscsi software set -e no", "x"},
      {"reboot", nullptr},
      {"iscsi software set -e yes", "x2"},
      {adapterSet + "y", "y"},
      {"iscsi software set -e yes", "y"},
      {"reboot", "y"},
      {"iscsi software set -e no", "y"},
      {"reboot", nullptr},
      {"iscsi software set -e yes", "y"},
      {"iscsi software set -e no", "y"},
      {set + "x2", "y"},
      {"reboot", "x2"},
      {set + "x3", "x2"},
      {adapterSet + "z", "z"},
      {"reboot", "z"},
  };
  for (const auto& [line, name] : steps) {
    if (line == "reboot") {
      simulator::Reboot();
    } else {
      ASSERT_EQ(host(line).status, 0) << line;
    }
    const nlohmann::json listed = host("iscsi adapter get -A hba0").result;
    const nlohmann::json shown = listed.is_null() ? listed : listed[0]["Name"];
    EXPECT_EQ(shown, name ? nlohmann::json(std::string("iqn.2026-11.org.example:") + name) : nullptr) << line;
  }
}

}  // namespace

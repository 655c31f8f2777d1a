// Random sequences of commands: whatever is done in whatever order, the host stays one that makes sense.
#include <random>
#include <set>

#include "host/Host.h"
#include "simulator/Commands.h"
#include "support/Harness.h"
#include "support/SweepTable.h"

namespace {

using nlohmann::json;

constexpr int kSequences = 25;
constexpr int kCommands = 160;  // of each sequence
constexpr int kLook = 20;       // the host is looked at as a whole after so many of them

/// Changes of the adapter "ind", and where in its record their values go.
const struct Change {
  const char* line;
  const char* pointer;
  json value;
} kChanges[] = {
    {"iscsi adapter set -A ind -a one", "/alias", "one"},
    {"iscsi adapter set -A ind -a two", "/alias", "two"},
    {"iscsi adapter param set -A ind -k MaxCmds -v 32", "/parameters/MaxCmds/current", 32},
    {"iscsi adapter param set -A ind -k HeaderDigest -v preferred", "/parameters/HeaderDigest", "preferred"},
    {"iscsi adapter auth chap set -A ind -l required -N u -S s3cr3t-adapter-uni", "/chap/uni/secret",
     "s3cr3t-adapter-uni"},
    {"iscsi networkportal ipconfig set -A ind -i 192.0.2.78", "/network/ipv4Address", "192.0.2.78"},
    {"iscsi networkportal ipconfig set -A ind -d true", "/network/useDhcpv4", true},
    {"iscsi physicalnetworkportal param set -A ind -o MTU -v 4000", "/network/mtu", 4000},
    {"iscsi physicalnetworkportal param set -A ind -o ArpRedirect -v 0", "/network/arpRedirect", false},
};

/// What hangs in the air: a row without the one it belongs to.
constexpr char kOrphans[] =
    "SELECT count(*) FROM object AS it LEFT JOIN object AS owner ON owner.id = it.parent WHERE"
    " (it.parent != 0 AND owner.id IS NULL) OR (it.kind = ?1 AND owner.kind IS NOT ?2)"
    " OR (it.kind = ?3 AND owner.kind IS NOT ?1)";

class Sequence {
 public:
  explicit Sequence(unsigned seed) : random_(seed), host_(sweep::HostDescription()) {
    host_.counts = false;
    remotes_ = host_.Show("/remoteTargets");
  }

  /// Ends at the first fault.
  void Run() {
    for (int i = 0; i < kCommands && !testing::Test::HasFailure(); ++i) {
      const auto choice = random_() % 10;
      if (choice == 0) {
        Check("reboot", host_("SimulatorReboot", simulator::NewReboot(), ""));
        ChangeNetwork();
      } else if (choice < 4) {
        const Change& change = kChanges[random_() % std::size(kChanges)];
        const Outcome run = host_(change.line);
        Check(change.line, run);
        if (run.result == true || run.result.is_string()) CheckThere(change);
      } else {
        const sweep::SweptCommand& command = sweep::Commands()[random_() % sweep::Commands().size()];
        const sweep::Texts options = sweep::Parts(command.lines);
        const std::string& line = options[random_() % options.size()];
        Check(command.name + ' ' + line, command.make == nullptr ? host_("iscsi " + command.name + ' ' + line)
                                                                 : host_(command.name, command.make(), line));
      }
      if (i % kLook != 0) continue;
      CheckListings();
      CheckReload();
    }
    if (testing::Test::HasFailure()) ADD_FAILURE() << "in the sequence:\n" << lines_;
  }

 private:
  void Check(const std::string& line, const Outcome& run) {
    lines_ += line + '\n';
    EXPECT_TRUE(run.status != 2 && run.status <= 3) << run.failure;
    EXPECT_FALSE(run.result.is_null() && run.messages.empty()) << "neither a result nor a message";
  }

  void CheckThere(const Change& change) {
    const json adapter = host_.Show("/adapters").back();
    const auto isAt = [&](const std::string& place) {
      const json::json_pointer full(place + change.pointer);
      return adapter.contains(full) && adapter[full] == change.value;
    };
    EXPECT_TRUE(isAt("") || isAt("/pending/reset") || isAt("/pending/reboot"))
        << "it reported success, and " << change.value << " is neither there nor pending";
  }

  /// Some targets are gone, are back, or meet initiators in another way.
  void ChangeNetwork() {
    json host = host_.Show();
    host["remoteTargets"] = json::array();
    for (json remote : remotes_) {
      const auto choice = random_() % 5;
      if (choice == 0) continue;
      if (choice == 1) remote["maxSessions"] = 1;
      if (choice == 2) remote["portals"].erase(0);
      host["remoteTargets"].push_back(std::move(remote));
    }
    lines_ += "load " + host["remoteTargets"].dump() + '\n';
    host::Host::Current().Load(host.dump());
  }

  /// No listing fails, and what is stored hangs together.
  void CheckListings() {
    host::Statement orphans(host::Host::Current().GetStore(), kOrphans);
    for (const host::Kind kind : {host::Kind::Session, host::Kind::Target, host::Kind::Connection}) {
      orphans.Bind(static_cast<std::int64_t>(kind));
    }
    EXPECT_EQ(orphans.Step() ? orphans.GetInt(0) : -1, 0);
    std::set<std::string> sessions;
    for (const std::string listing :
         {"adapter list", "adapter target list", "adapter target portal list",
          "adapter discovery statictarget list", "session list", "session connection list",
          "networkportal list", "logicalnetworkportal list", "physicalnetworkportal list"}) {
      const Outcome run = host_("iscsi " + listing);
      EXPECT_TRUE(run.status == 0 && run.result.is_array()) << listing << " fails: " << run.err;
      for (const json& row : run.result) {
        if (listing != "session list") continue;
        EXPECT_TRUE(sessions.insert(row["ID"].get<std::string>()).second) << row << ": two such sessions";
      }
    }
  }

  /// What is shown loads, and is an equal host then.
  void CheckReload() {
    const std::string shown = host::Host::Current().Show(true);
    host::Host::Current().Load(shown);
    EXPECT_EQ(json::diff(json::parse(shown), host_.Show()), json::array());
  }

  std::mt19937 random_;
  TemporaryRoot root_;
  Harness host_;
  json remotes_;
  std::string lines_;
};

TEST(Property, AnySequenceLeavesAHostThatMakesSense) {
  for (unsigned seed = 1; seed <= kSequences && !HasFailure(); ++seed) {
    SCOPED_TRACE("seed " + std::to_string(seed));
    Sequence(seed).Run();
  }
}

}  // namespace

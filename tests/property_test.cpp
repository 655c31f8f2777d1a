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
constexpr int kCommands = 80;  // of each sequence
constexpr int kLook = 20;      // the host is looked at as a whole after so many of them

/// Changes of the adapter "ind", and where in its record their values go.
const struct Change {
  const char* line;
  const char* pointer;
  json value;
} kChanges[] = {
    {"iscsi adapter set -A ind -a one", "/alias", "one"},
    {"iscsi adapter set -A ind -a two", "/alias", "two"},
    {"iscsi adapter param set -A ind -k MaxCmds -v 32", "/parameters/MaxCmds/current", 32},
    {"iscsi adapter param set -A ind -k MaxBurstLength -v 1024", "/parameters/MaxBurstLength/current", 1024},
    {"iscsi adapter param set -A ind -k HeaderDigest -v preferred", "/parameters/HeaderDigest", "preferred"},
    {"iscsi adapter auth chap set -A ind -l required -N u -S s3cr3t-adapter-uni", "/chap/uni/secret",
     "s3cr3t-adapter-uni"},
    {"iscsi networkportal ipconfig set -A ind -i 192.0.2.78", "/network/ipv4Address", "192.0.2.78"},
    {"iscsi networkportal ipconfig set -A ind -d true", "/network/useDhcpv4", true},
    {"iscsi physicalnetworkportal param set -A ind -o MTU -v 4000", "/network/mtu", 4000},
    {"iscsi physicalnetworkportal param set -A ind -o ArpRedirect -v 0", "/network/arpRedirect", false},
};

class Sequence {
 public:
  explicit Sequence(unsigned seed) : random_(seed), host_(sweep::HostDescription()) { host_.counts = false; }

  /// What went wrong; empty when nothing did.
  std::string Run() {
    const auto& commands = sweep::Commands();
    std::string fault;
    for (int i = 0; i < kCommands && fault.empty(); ++i) {
      const auto choice = random_() % 10;
      if (choice == 0) {
        fault = Step("reboot", host_("SimulatorReboot", simulator::NewReboot(), ""));
      } else if (choice < 4) {
        const Change& change = kChanges[random_() % std::size(kChanges)];
        const Outcome run = host_(change.line);
        fault = Step(change.line, run);
        if (fault.empty() && (run.result == true || run.result.is_string())) fault = IsThere(change);
      } else {
        const sweep::SweptCommand& command = commands[random_() % commands.size()];
        const sweep::Texts options = sweep::Parts(command.lines);
        const std::string& line = options[random_() % options.size()];
        fault = Step(command.name + ' ' + line, command.make == nullptr
                                                    ? host_("iscsi " + command.name + ' ' + line)
                                                    : host_(command.name, command.make(), line));
      }
      if (fault.empty() && i % kLook == 0) fault = Listings() + Reloaded();
    }
    return fault;
  }
  const std::string& Lines() const { return lines_; }

 private:
  std::string Step(const std::string& line, const Outcome& run) {
    lines_ += line + '\n';
    if (run.status == 2 || run.status > 3) return "status " + std::to_string(run.status) + ": " + run.failure;
    return run.result.is_null() && run.messages.empty() ? "neither a result nor a message" : "";
  }

  std::string IsThere(const Change& change) {
    const json adapter = host_.Show("/adapters").back();
    for (const char* place : {"", "/pending/reset", "/pending/reboot"}) {
      const json::json_pointer full(std::string(place) + change.pointer);
      if (adapter.contains(full) && adapter[full] == change.value) return {};
    }
    return "it reported success, and " + change.value.dump() + " is neither there nor pending";
  }

  /// No listing fails, and what is shown hangs together.
  std::string Listings() {
    std::set<std::string> targets;
    std::set<std::string> sessions;
    for (const std::string listing :
         {"adapter list", "adapter target list", "adapter target portal list",
          "adapter discovery statictarget list", "session list", "session connection list",
          "networkportal list", "logicalnetworkportal list", "physicalnetworkportal list"}) {
      const Outcome run = host_("iscsi " + listing);
      if (run.status != 0 || !run.result.is_array()) return listing + " fails: " + run.err;
      for (const json& row : run.result) {
        const auto text = [&](const char* field) { return row[field].get<std::string>(); };
        if (listing == "adapter target list") targets.insert(text("ID"));
        if (listing == "session list") {
          if (!targets.contains(text("Adapter") + ',' + text("Target")))
            return text("ID") + ": no such target";
          if (!sessions.insert(text("ID")).second) return text("ID") + ": two such sessions";
        }
        if (listing == "session connection list" &&
            !sessions.contains(text("Adapter") + ',' + text("Target") + ',' + text("ISID"))) {
          return row.dump() + ": no such session";
        }
      }
    }
    return {};
  }

  /// What is shown loads, and is an equal host then.
  static std::string Reloaded() {
    const std::string shown = host::Host::Current().Show(true);
    host::Host::Current().Load(shown);
    const json changes = json::diff(json::parse(shown), json::parse(host::Host::Current().Show(true)));
    return changes.empty() ? "" : "the host that was shown is another one after load: " + changes.dump();
  }

  std::mt19937 random_;
  TemporaryRoot root_;
  Harness host_;
  std::string lines_;
};

TEST(Property, AnySequenceLeavesAHostThatMakesSense) {
  for (unsigned seed = 1; seed <= kSequences; ++seed) {
    Sequence sequence(seed);
    const std::string fault = sequence.Run();
    ASSERT_EQ(fault, "") << "seed " << seed << ":\n" << sequence.Lines();
  }
}

}  // namespace

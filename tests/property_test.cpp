// Random sequences of commands: whatever is done in whatever order, the host stays one that makes sense.
#include <random>
#include <set>

#include "host/Host.h"
#include "simulator/Commands.h"
#include "simulator/Simulator.h"
#include "support/Harness.h"
#include "support/SweepTable.h"

namespace {

using nlohmann::json;

constexpr int kSequences = 25;
constexpr int kCommands = 160;  // of each sequence
constexpr int kLook = 20;       // the host is looked at as a whole after so many of them

class Sequence {
 public:
  explicit Sequence(unsigned seed) : random_(seed), host_(sweep::HostDescription()) {
    remotes_ = host_.Show("/remoteTargets");
  }

  /// Ends at the first fault.
  void Run() {
    for (int i = 0; i < kCommands && !testing::Test::HasFailure(); ++i) {
      if (random_() % 10 == 0) {
        Check("reboot", host_(simulator::NewReboot(), ""));
        ChangeNetwork();
      } else {
        const sweep::SweptCommand& command = sweep::Commands()[random_() % sweep::Commands().size()];
        const sweep::Texts options = sweep::Parts(command.lines);
        const std::string& line = options[random_() % options.size()];
        Check(command.name + ' ' + line, command.make == nullptr ? host_("iscsi " + command.name + ' ' + line)
                                                                 : host_(command.make(), line));
      }
      if (i % kLook == 0) Look();
    }
    if (testing::Test::HasFailure()) ADD_FAILURE() << "in the sequence:\n" << lines_;
  }

 private:
  void Check(const std::string& line, const Outcome& run) {
    lines_ += line + '\n';
    EXPECT_TRUE(run.status != 2 && run.status <= 3) << run.failure;
    EXPECT_FALSE(run.result.is_null() && run.messages.empty()) << "neither a result nor a message";
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
    simulator::Load(host.dump());
  }

  /// No two sessions are one, and what is shown loads, and is an equal host then.
  void Look() {
    const std::vector<std::string> sessions = host_("iscsi session list").Column("ID");
    EXPECT_EQ(std::set<std::string>(sessions.begin(), sessions.end()).size(), sessions.size());
    const std::string shown = simulator::Show(true);
    simulator::Load(shown);
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

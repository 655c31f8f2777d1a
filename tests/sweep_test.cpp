// Every library call of every command fails, in every way that it can: what is reported, what is posted, what
// stays stored, what is given back.
#include <algorithm>
#include <cstdio>
#include <fstream>
#include <optional>
#include <regex>
#include <set>
#include <sstream>

#include "corectl/Adapter.h"
#include "host/Host.h"
#include "host/Restart.h"
#include "ima/Memory.h"
#include "plinth/CommandLine.h"
#include "plinth/Declarations.h"
#include "plinth/OwnCommands.h"
#include "support/FailingAllocation.h"
#include "support/Harness.h"
#include "support/ProjectFile.h"
#include "support/SweepTable.h"
#include "support/Words.h"

namespace {

using nlohmann::json;
using sweep::Statuses;
using sweep::SweptCommand;
using sweep::Texts;

constexpr char kReboot[] = "Reboot required to complete operation.";

/// Each way in which a call can go wrong: the keys of an answer.
std::vector<json> FaultsOf(const std::string& operation) {
  const host::Gives gives = host::FindOperation(operation)->gives;
  std::vector<json> faults;
  if (gives == host::Gives::Ima) {
    // Success with a reboot, not supported, no memory, a number of nobody's.
    for (const std::uint32_t status : {0x1u, 0x80000001u, 0x80000002u, 0xffffffffu}) {
      faults.push_back({{"imaStatus", status}});
    }
    return faults;
  }
  for (const char* thrown : {"NodeCtlException", "CoreCtlException", "bad_alloc"}) {
    faults.push_back({{"throw", thrown}, {"text", sweep::kReason}});
  }
  if (gives == host::Gives::Status) {
    for (int status = 0; status <= 5; ++status) faults.push_back({{"status", status}});
  }
  return faults;
}

bool GivesStatus(const std::string& operation) {
  return host::FindOperation(operation)->gives == host::Gives::Status;
}

/// All rows of the current host, but for the answers and for times, which differ between two runs.
std::string HostRows() {
  host::Statement rows(host::Host::Current().GetStore(),
                       "SELECT kind || ' ' || coalesce(name, '') || ' ', record FROM object WHERE kind<>2"
                       " ORDER BY kind, id");
  std::string text;
  while (rows.Step()) {
    auto record = host::Record::Stored(rows.GetBytes(1));
    for (const char* time : {"sessionCreateTime", "connectionCreateTime", "connectionStartTime"}) {
      record.Erase(time);
    }
    text.append(rows.GetText(0)).append(record.GetJson().dump()) += '\n';
  }
  return text;
}

/// Makes an image file, and has it stand for FILE in the line.
void NameImage(const TemporaryRoot& root, std::string& line) {
  const std::string image = root.Path() + "/image";
  std::ofstream(image) << "ISCSI-ADAPTER-IMAGE 1\ntype: firmware\nversion: 9\nlength: 0\n";
  if (const std::size_t file = line.find("FILE"); file != line.npos) line.replace(file, 4, image);
}

/// What came of a run of a command line.
struct SweptRun : Outcome {
  Texts states;          ///< all that the host kept ahead of each call; last, behind the run
  Texts statesReset;     ///< the same, had the adapter been reset then
  std::string rebooted;  ///< what the host would keep once it has booted again
  std::string told;      ///< all of it, for who reads of a deviation
  std::string shown;     ///< the calls, the reports and the result, as a golden file has them
};

/// Runs the line on a host of its own, where the library answers as @p answers say, and checks what holds for
/// every run. The states between the calls are kept, and the result shown as text, where there is no fault.
SweptRun RunOf(const SweptCommand& command, std::string line, const std::vector<json>& answers,
               bool isWell = false) {
  std::string title = command.name + (line.empty() ? "" : ' ' + line);
  if (isWell && !answers.empty()) title += ", where changes give status " + answers.back()["status"].dump();
  const TemporaryRoot root;
  NameImage(root, line);
  static const json kHost = json::parse(sweep::HostDescription());
  json description = kHost;
  description["answers"] = answers;
  Harness host(description.dump());

  const auto state = [&] { return root.Read("etc/tessaro/coreiscsid/initiatorname.iscsi") + HostRows(); };
  const auto stateAfter = [&](const auto& change) {
    host::Store& store = host::Host::Current().GetStore();
    const host::Transaction takenBack(store, host::Transaction::Access::Change);
    host::Tree tree(store);
    change(tree);
    return state();
  };
  SweptRun run;
  Texts trace;
  const auto look = [&] {
    run.states.push_back(state());
    run.statesReset.push_back(stateAfter(
        [](host::Tree& tree) { host::Reset(tree, *tree.Find(host::kRoot, host::Kind::Adapter, "ind")); }));
  };
  if (isWell) look();
  host::SetTraceSink([&](const std::string& call) {
    trace.push_back(call);
    if (isWell) look();
  });
  if (!isWell) line += " --output json";
  static_cast<Outcome&>(run) =
      command.make == nullptr ? host("iscsi " + command.name + ' ' + line) : host(command.make(), line);
  run.trace = trace;
  run.states.push_back(state());
  // A failure says nothing of what waits for a reboot.
  if (isWell || answers.front().contains("status")) run.rebooted = stateAfter(host::Reboot);

  std::ostringstream shown;
  shown << "$ " << title << '\n';
  for (const std::string& call : trace) shown << "  " << call << '\n';
  for (const std::string& message : run.messages) shown << "! " << message << '\n';
  for (const json& row : run.result.is_array() ? run.result : json::array({run.result})) shown << row << '\n';
  if (command.make != nullptr) shown << run.out;
  run.shown = std::regex_replace(shown.str(), std::regex(root.Path()), "ROOT") + '\n';

  const std::string said =
      testing::PrintToString(run.messages) + ' ' + run.failure + "\n  calls " + testing::PrintToString(trace);
  run.told = command.name + ' ' + line + "\n  with " + json(answers).dump() + "\n  status " +
             std::to_string(run.status) + ", reports " + said;
  SCOPED_TRACE(run.told);
  EXPECT_EQ(corectl::LiveInterfaces(), 0) << "interface objects are left";
  EXPECT_EQ((run.out + run.err + said).find(sweep::kSecret), std::string::npos) << "a secret shows";
  EXPECT_TRUE(run.reasons.empty() || run.status != Plinth::kSuccess) << "a reason without a report";
  if (isWell) return run;
  const json document = json::parse(run.out, nullptr, false);
  Texts messages = run.messages;
  if (!run.failure.empty()) messages.push_back(run.failure);
  EXPECT_TRUE(document.is_object() && document["status"] == run.status && document["messages"] == messages &&
              document["result"].is_null() == run.result.is_null() &&
              document.value("reasons", json::array()).size() == run.reasons.size())
      << run.out;
  return run;
}

/// The numbers that the sweep prints.
struct Numbers {
  std::set<std::string> commands;
  int lines = 0;
  std::size_t calls = 0;
  int faults = 0;
  std::string shown;  ///< by all runs without a fault
};

/// The code of the reason that a failing call gives.
std::string CodeOf(const json& fault) {
  const std::uint32_t imaStatus = fault.value("imaStatus", 0u);
  if (fault.value("throw", "") == "bad_alloc" || imaStatus == 0x80000002u) return "no-memory";
  return imaStatus == 0x80000001u || fault.value("status", 0) == 4 ? "not-supported" : "failed";
}

/// Operation and code of a reason.
Texts ReasonOf(const std::string& operation, const json& fault) { return {operation + ' ' + CodeOf(fault)}; }

Texts ReasonsOf(const Outcome& run) {
  Texts reasons;
  for (const Plinth::Reason& reason : run.reasons) {
    reasons.push_back(reason.operation + ' ' + reason.code);
    EXPECT_NE(reason.text, "");
  }
  return reasons;
}

/// What a run has to be like.
struct Expected {
  Texts calls;
  bool callsGoOn = false;  ///< more may follow
  Texts messages = {};
  Texts reasons = {};
  bool result = false;
  bool toFramework = false;
  std::optional<std::string> state = {};
  /// All changes of a run without a fault were made, though some may wait for a reboot.
  bool allChanges = false;
};

/// One command line, where each of its changes gives the same status.
class Sweep {
 public:
  /// @p changes are the operations that give @p status, where it is not 0.
  Sweep(const SweptCommand& command, const std::string& line, int status,
        const std::set<std::string>& changes, Numbers& numbers)
      : command_(command), line_(line), status_(status), numbers_(numbers) {
    for (const std::string& change : changes) variant_.push_back({{"operation", change}, {"status", status}});
    well_ = RunOf(command, line, variant_, true);
    calls_ = well_.Calls();
  }

  /// The operations among the calls that give a status.
  std::set<std::string> Run() {
    EXPECT_TRUE(!well_.result.is_null() && well_.closed) << well_.told;
    numbers_.shown += well_.shown;
    numbers_.commands.insert(command_.name);
    if (status_ == 0) {
      EXPECT_TRUE(well_.status == 0 && well_.messages.empty()) << well_.told;
      ++numbers_.lines;
      numbers_.calls += calls_.size();
    }
    for (std::size_t at = 0; at < calls_.size(); ++at) {
      for (const json& fault : FaultsOf(calls_[at])) {
        if (status_ == 0 || !fault.contains("status")) RunFault(at, fault);
      }
    }
    std::set<std::string> changes;
    std::copy_if(calls_.begin(), calls_.end(), std::inserter(changes, changes.end()), GivesStatus);
    return changes;
  }

 private:
  static Texts::const_iterator Past(const Texts& calls, std::size_t at) {
    return calls.begin() + static_cast<std::ptrdiff_t>(at) + 1;
  }
  /// @p fault as the answer to the call @p at of @p calls.
  static json AnswerTo(const Texts& calls, std::size_t at, json fault) {
    fault["operation"] = calls[at];
    fault["call"] = std::count(calls.begin(), Past(calls, at), calls[at]);
    return fault;
  }

  void RunFault(std::size_t at, const json& fault) {
    std::vector<json> answers = variant_;
    answers.insert(answers.begin(), AnswerTo(calls_, at, fault));
    const SweptRun run = RunOf(command_, line_, answers);
    SCOPED_TRACE(run.told);
    ++numbers_.faults;
    const bool isStatus = fault.contains("status");
    const Expected expected = isStatus ? OfStatus(at, fault) : OfFailure(at, fault);
    Compare(run, expected);
    if (expected.callsGoOn || isStatus) return;
    // What the command still calls behind a failure can fail as well.
    const Texts made = run.Calls();
    for (std::size_t more = at + 1; more < made.size(); ++more) {
      for (const json& second : FaultsOf(made[more])) RunSecondFault(run, more, second, answers);
    }
  }

  void RunSecondFault(const SweptRun& first, std::size_t at, const json& fault, std::vector<json> answers) {
    const Texts made = first.Calls();
    answers.insert(answers.begin() + 1, AnswerTo(made, at, fault));
    const SweptRun run = RunOf(command_, line_, answers);
    SCOPED_TRACE(run.told);
    ++numbers_.faults;
    EXPECT_EQ(run.Calls(), made);
    EXPECT_TRUE(run.result.is_null() && !run.closed);
    // What was asked to understand the first failure takes its place: nothing was reported in between.
    Texts reasons = made[at] == "IsSoftwareOrDependent" ? Texts{} : ReasonsOf(first);
    reasons.push_back(ReasonOf(made[at], fault).front());
    EXPECT_EQ(ReasonsOf(run), reasons);
    if (fault.value("throw", "") == "bad_alloc") {
      EXPECT_TRUE(run.status == Plinth::kFailure && !run.failure.empty()) << "no memory goes unseen";
      return;
    }
    Texts messages = first.messages;
    if (command_.statuses == Statuses::Gathered) {
      messages.push_back(sweep::kReason);
    } else if (made[at] != "IsSoftwareOrDependent") {  // that one only asks what the first failure means
      const Texts more = sweep::ReportsOf(command_, made[at]);
      messages.insert(messages.end(), more.begin(), more.end());
    }
    EXPECT_EQ(run.messages, messages);
  }

  Expected OfFailure(std::size_t at, const json& fault) {
    const std::string& operation = calls_[at];
    const std::string thrown = fault.value("throw", "");
    const sweep::Behind behind = sweep::BehindOf(command_, operation, thrown);
    Expected expected{.calls = {calls_.cbegin(), Past(calls_, at)}, .state = well_.states[at]};
    const auto changes = std::count_if(calls_.cbegin(), Past(calls_, at) - 1, GivesStatus);
    if (status_ == 1 && command_.statuses == Statuses::Shown) {
      expected.messages.assign(static_cast<std::size_t>(changes), kReboot);
    }
    if (thrown == "bad_alloc" || behind == sweep::Behind::ToFramework) {
      expected.toFramework = true;
      expected.reasons = ReasonOf(operation, fault);
      return expected;
    }
    if (behind != sweep::Behind::GoesOn) expected.reasons = ReasonOf(operation, fault);
    if (behind == sweep::Behind::GoesOn) {
      expected.callsGoOn = true;
      expected.result = true;
      return expected;
    }
    if (behind == sweep::Behind::AsksKind) expected.calls.push_back("IsSoftwareOrDependent");
    if (behind == sweep::Behind::TakesBack) {
      expected.calls.push_back("IMA_TSR_RemoveRoute");
      expected.state = well_.states.front();
    }
    expected.result = behind == sweep::Behind::KeepsRows;
    const Texts reports = sweep::ReportsOf(command_, operation);
    EXPECT_FALSE(reports.empty()) << "no text is known for a failure of " << operation;
    expected.messages.insert(expected.messages.end(), reports.begin(), reports.end());
    if (status_ == 2 && command_.statuses == Statuses::Gathered && changes > 0) {
      expected.calls.push_back("ResetAdapter");
      expected.state = well_.statesReset[at];
    }
    return expected;
  }

  Expected OfStatus(std::size_t at, const json& fault) {
    const int status = fault["status"];
    Expected expected{.calls = calls_, .result = true, .allChanges = status != 4};
    const bool changesMore = std::any_of(Past(calls_, at), calls_.cend(),
                                         [](const std::string& call) { return call.starts_with("Set"); });
    if (status == 4 && !changesMore) expected.state = well_.states[at];
    if (command_.statuses == Statuses::Shown) {
      if (status == 1) expected.messages = {kReboot};
      if (status == 4) {
        expected.messages = {"Operation not supported for this adapter."};
        expected.reasons = ReasonOf(calls_[at], fault);
      }
      if (status == 2) expected.calls.insert(Past(expected.calls, at), "ResetAdapter");
    } else if (command_.statuses == Statuses::Gathered && status == 2) {
      expected.calls.push_back("ResetAdapter");
    }
    return expected;
  }

  void Compare(const SweptRun& run, const Expected& expected) {
    Texts made = run.Calls();
    if (expected.callsGoOn) made.resize(std::min(made.size(), expected.calls.size()));
    EXPECT_EQ(made, expected.calls);
    EXPECT_EQ(run.messages, expected.messages);
    EXPECT_EQ(ReasonsOf(run), expected.reasons);
    EXPECT_EQ(!run.result.is_null(), expected.result);
    EXPECT_EQ(run.closed, expected.result);
    const int status = expected.toFramework   ? Plinth::kFailure
                       : !expected.result     ? Plinth::kReported
                       : run.messages.empty() ? Plinth::kSuccess
                                              : Plinth::kResultAndReported;
    EXPECT_EQ(run.status, status);
    EXPECT_EQ(!run.failure.empty(), expected.toFramework) << run.failure;
    EXPECT_EQ(run.states.back(), expected.state.value_or(run.states.back()));
    EXPECT_TRUE(!expected.allChanges || run.rebooted == well_.rebooted) << run.rebooted << "instead of\n"
                                                                        << well_.rebooted;
  }

  const SweptCommand& command_;
  std::string line_;
  int status_;
  Numbers& numbers_;
  std::vector<json> variant_;  ///< the answers that ask for a reset or a reboot at each change
  SweptRun well_;              ///< the run without a fault
  Texts calls_;
};

TEST(Sweep, EveryCallFailsInEveryWay) {
  Numbers numbers;
  for (const SweptCommand& command : sweep::Commands()) {
    // What the others declare stands in the catalogue.
    if (command.make != nullptr) numbers.shown += Harness("{}")(command.make(), "--help").out;
    for (const std::string& line : sweep::Parts(command.lines)) {
      const std::set<std::string> changes = Sweep(command, line, 0, {}, numbers).Run();
      if (changes.empty()) continue;
      for (const int status : {1, 2}) Sweep(command, line, status, changes, numbers).Run();
    }
  }
  const int deviations = testing::UnitTest::GetInstance()->current_test_info()->result()->total_part_count();
  std::printf("sweep: %zu commands, %d command lines, %zu library calls, %d faults, %d deviations\n",
              numbers.commands.size(), numbers.lines, numbers.calls, numbers.faults, deviations);
  ExpectFile("tests/golden/commands.txt", numbers.shown);
  std::size_t paths = 0;
  for (const json& node : Harness("{}")("catalogue").result) {
    const std::string path = node["path"];
    if (node["kind"] != "command" || !path.starts_with("iscsi ")) continue;
    ++paths;
    EXPECT_NE(node["description"], "") << path;
    EXPECT_TRUE(numbers.commands.contains(path.substr(6))) << path << " is not in the table of the sweep";
  }
  EXPECT_EQ(numbers.commands.size(), paths + 10) << "ten commands stand on no path";
}

TEST(Sweep, EveryListIsDeclaredWithOneSampleRow) {
  Plinth::WalkTree(CommandTree(), "", [](const std::string& path, auto& node) {
    auto* const command = dynamic_cast<Plinth::AutoCli::Command*>(&node);
    if (command == nullptr || !path.starts_with("iscsi ")) return;
    const auto prototype = Plinth::PrototypeOf(*command->GetOutputSpec());
    const auto* const list = dynamic_cast<const Plinth::MetaObj::MetaList*>(prototype.get());
    if (list == nullptr) return;
    EXPECT_EQ(list->GetSize(), path == "iscsi adapter list" ? 0u : 1u) << path;
  });
}

// Dry runs

/// A run of the line, and whether it left the host other than it was.
struct TriedRun : Outcome {
  bool changed = false;
};

TriedRun Try(const SweptCommand& command, std::string line) {
  const TemporaryRoot root;
  Harness host(sweep::HostDescription());
  const auto state = [&] { return root.Read("etc/tessaro/coreiscsid/initiatorname.iscsi") + HostRows(); };
  const std::string before = state();
  line += " --output json";
  TriedRun run;
  static_cast<Outcome&>(run) =
      command.make == nullptr ? host("iscsi " + command.name + ' ' + line) : host(command.make(), line);
  run.changed = state() != before;
  return run;
}

TEST(Sweep, ADryRunGivesWhatTheRunWouldAndChangesNothing) {
  const TemporaryRoot images;
  int changing = 0;
  for (const SweptCommand& command : sweep::Commands()) {
    for (std::string line : sweep::Parts(command.lines)) {
      NameImage(images, line);
      SCOPED_TRACE(command.name + ' ' + line);
      const TriedRun real = Try(command, line);
      const TriedRun dry = Try(command, line + " --dry-run");
      EXPECT_EQ(dry.status, real.status);
      EXPECT_EQ(dry.messages, real.messages);
      EXPECT_EQ(dry.result, real.result);
      EXPECT_EQ(dry.trace, real.trace);
      EXPECT_FALSE(dry.changed);
      const json calls = json::parse(dry.out)["calls"];
      EXPECT_EQ(!calls.empty(), real.changed) << calls;
      EXPECT_EQ(calls.dump().find(sweep::kSecret), std::string::npos) << calls;
      changing += real.changed;
    }
  }
  EXPECT_GT(changing, 40);
}

// Memory runs out

/// Allocation after allocation of @p line fails, until it succeeds: the command fails as a whole or reports,
/// and gives back what it holds. Gives their number.
long Exhaust(const std::string& line) {
  const Texts words = SplitWords("iscsi " + line);
  Plinth::AutoCli::Namespace& tree = CommandTree();
  const Harness host(sweep::HostDescription());
  host::SetTraceSink(nullptr);  // what the trace needs of memory is not the program's
  for (long number = 1;; ++number) {
    Plinth::RunRecord run;
    Plinth::TextConsole console;
    // The standard files of the process take no memory.
    console.out.text.reserve(std::size_t{1} << 16);
    console.error.text.reserve(std::size_t{1} << 12);
    // What the simulated host does in a transaction is its own: the answers let that fail as a whole.
    std::optional<FailingAllocation> failing(
        std::in_place, number, [] { return host::Host::Current().GetStore().IsInTransaction(); });
    EXPECT_NO_THROW(run = Plinth::RunCommandLine(tree, words, console, {.checked = true}));
    const bool happened = failing->HasHappened();
    failing.reset();
    if (!happened) return number - 1;
    SCOPED_TRACE(line + " with allocation " + std::to_string(number) + " failing: " + console.error.text);
    EXPECT_EQ(corectl::LiveInterfaces(), 0);
    EXPECT_EQ(ima::OutstandingAllocations(), 0u);
    EXPECT_NE(run.status, Plinth::kUsage);
    EXPECT_EQ(run.failure.empty() && run.messages.empty(), run.status == Plinth::kSuccess);
  }
}

TEST(Sweep, EveryAllocationFails) {
  long failures = 0;
  for (const char* line : {"adapter list", "adapter param get -A ind", "adapter target portal list",
                           "plugin list", "networkportal list", "session connection list"}) {
    failures += Exhaust(line);
  }
  std::printf("sweep: 6 command lines, %ld allocations failed\n", failures);
  EXPECT_GT(failures, 500);
}

}  // namespace

// Every library call of every command fails, in every way that it can: what is reported, what is posted, what
// stays stored, what is given back.
#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <optional>
#include <set>
#include <sstream>

#include "corectl/Adapter.h"
#include "host/Host.h"
#include "host/Restart.h"
#include "ima/Memory.h"
#include "plinth/CommandLine.h"
#include "support/FailingAllocation.h"
#include "support/Harness.h"
#include "support/SweepTable.h"

namespace {

using nlohmann::json;
using sweep::Statuses;
using sweep::SweptCommand;
using sweep::Texts;

constexpr char kReboot[] = "Reboot required to complete operation.";
constexpr char kNotSupported[] = "Operation not supported for this adapter.";

/// One way in which a call can go wrong: the keys of an answer.
struct Fault {
  json keys;
  std::string thrown;         ///< the exception, if it is one
  std::optional<int> status;  ///< the iScsiStatus, if it is one
};

std::vector<Fault> FaultsOf(const std::string& operation) {
  const host::Gives gives = host::FindOperation(operation)->gives;
  std::vector<Fault> faults;
  if (gives == host::Gives::Ima) {
    // Success with a reboot, not supported, no memory, a number of nobody's.
    for (const std::uint32_t status : {0x1u, 0x80000001u, 0x80000002u, 0xffffffffu}) {
      faults.push_back({{{"imaStatus", status}}, "", {}});
    }
    return faults;
  }
  for (const char* thrown : {"NodeCtlException", "CoreCtlException", "bad_alloc"}) {
    faults.push_back({{{"throw", thrown}, {"text", sweep::kReason}}, thrown, {}});
  }
  if (gives == host::Gives::Status) {
    for (int status = 0; status <= 5; ++status) faults.push_back({{{"status", status}}, "", status});
  }
  return faults;
}

bool GivesStatus(const std::string& operation) {
  return host::FindOperation(operation)->gives == host::Gives::Status;
}

/// All rows of the current host, answers aside.
std::string HostRows() {
  host::Statement rows(
      host::Host::Current().GetStore(),
      "SELECT kind || ' ' || place || ' ' || coalesce(name, '') || ' ' || record FROM object WHERE kind<>2 "
      "ORDER BY kind, id");
  std::string text;
  while (rows.Step()) text += '\n' + rows.GetText(0);
  // The sessions of two runs begin at different times.
  static constexpr std::string_view kTime = "Time\":\"";
  for (std::size_t at = 0; (at = text.find(kTime, at)) != text.npos;) {
    at += kTime.size();
    text.erase(at, text.find('"', at) - at);
  }
  return text;
}

/// The numbers that the sweep prints.
struct Numbers {
  std::set<std::string> commands;
  int lines = 0;
  int calls = 0;
  int faults = 0;
  int deviations = 0;
};

/// A host on which one command line is run again and again. It is made anew only when a run has changed it.
class SweptHost {
 public:
  SweptHost(const SweptCommand& command, const std::string& line) : command_(command), line_(line) {
    std::ofstream(root_.Path() + "/image")
        << "ISCSI-ADAPTER-IMAGE 1\ntype: firmware\nversion: 9\nlength: 0\n";
    const std::size_t file = line_.find("FILE");
    if (file != std::string::npos) line_.replace(file, 4, root_.Path() + "/image");
    Renew();
    untouched_ = State();
  }
  ~SweptHost() { host::SetTraceSink(nullptr); }

  /// Runs the line while the library answers as @p answers say. `call` counts from the start of this run.
  Outcome Run(const std::vector<json>& answers, const std::string& more = " --output json") {
    if (State() != untouched_) Renew();
    SetAnswers(answers);
    states.clear();
    statesReset.clear();
    trace_.clear();
    Outcome run = command_.make == nullptr ? (*host_)("iscsi " + command_.name + ' ' + line_ + more)
                                           : (*host_)(command_.name, command_.make(), line_ + more);
    run.trace = trace_;
    for (const std::string& call : run.Calls()) counts_[call] += answers.empty() ? 0 : 1;
    SetAnswers({});
    after = State();
    return run;
  }

  /// All that the host keeps, answers aside.
  std::string State() const { return root_.Read("etc/tessaro/coreiscsid/initiatorname.iscsi") + HostRows(); }
  /// What it would keep once it has booted again.
  std::string StateRebooted() const { return StateAfter(host::Reboot); }

  std::string after;  ///< State() behind the last run
  bool keepsStates = false;
  /// Of the last run, where wanted, behind each call: what the host kept, and what it would had its adapter
  /// been reset.
  std::vector<std::string> states;
  std::vector<std::string> statesReset;

 private:
  /// What the host would keep after @p change, which is taken back.
  template <class Change>
  std::string StateAfter(Change change) const {
    host::Store& store = host::Host::Current().GetStore();
    const host::Transaction takenBack(store, host::Transaction::Access::Change);
    host::Tree tree(store);
    change(tree);
    return State();
  }

  void Renew() {
    host_.reset();
    std::error_code ignored;
    std::filesystem::remove_all(root_.Path() + "/etc", ignored);
    host_ = std::make_unique<Harness>(sweep::HostDescription());
    host_->counts = false;  // the table of the sweep is no test of what one command does
    counts_.clear();
    host::SetTraceSink([this](const std::string& line) {
      trace_.push_back(line);
      if (!keepsStates) return;
      states.push_back(State());
      statesReset.push_back(StateAfter(
          [](host::Tree& tree) { host::Reset(tree, *tree.Find(host::kRoot, host::Kind::Adapter, "ind")); }));
    });
  }

  void SetAnswers(const std::vector<json>& answers) {
    host::Store& store = host::Host::Current().GetStore();
    host::Transaction transaction(store, host::Transaction::Access::Change);
    host::Tree tree(store);
    for (const std::int64_t id : tree.ChildIds(host::kRoot, host::Kind::Answer)) tree.Remove(id);
    for (json answer : answers) {
      if (answer.contains("call")) {
        answer["call"] = answer["call"].get<int>() + counts_[answer["operation"].get<std::string>()];
      }
      tree.InsertNew(host::kRoot, host::Kind::Answer, host::Record::Parse(answer.dump()));
    }
    transaction.Commit();
  }

  const SweptCommand& command_;
  std::string line_;
  TemporaryRoot root_;
  std::unique_ptr<Harness> host_;
  std::vector<std::string> trace_;
  std::map<std::string, int> counts_;
  std::string untouched_;
};

/// What a run has to be like.
struct Expected {
  Texts calls;
  bool callsGoOn = false;  ///< more may follow
  Texts messages = {};
  bool result = false;
  bool toFramework = false;
  std::optional<std::string> state = {};
  /// All changes of a run without a fault were made, though some may wait for a reboot.
  bool allChanges = false;
};

/// One command line, and what was asked of it for all its changes.
class Sweep {
 public:
  Sweep(const SweptCommand& command, const std::string& line, int status, Numbers& numbers)
      : command_(command), status_(status), numbers_(numbers), host_(command, line) {
    what_ = "iscsi " + command.name + ' ' + line;
  }

  /// False where the line makes no change with a status.
  bool Run() {
    if (!RunWell()) return false;
    for (std::size_t at = 0; at < calls_.size(); ++at) {
      for (const Fault& fault : FaultsOf(calls_[at])) {
        if (!fault.status || status_ == 0) RunFault(at, fault);
      }
    }
    return std::any_of(calls_.begin(), calls_.end(), GivesStatus);
  }

 private:
  bool RunWell() {
    host_.keepsStates = true;
    initial_ = host_.State();
    well_ = host_.Run({}, "");
    calls_ = well_.Calls();
    if (status_ != 0) {
      // Which changes there are showed only now.
      what_ += " with status " + std::to_string(status_) + " for each change";
      for (const std::string& call : std::set<std::string>(calls_.begin(), calls_.end())) {
        if (GivesStatus(call)) variant_.push_back({{"operation", call}, {"status", status_}});
      }
      well_ = host_.Run(variant_, "");
      calls_ = well_.Calls();
    }
    states_ = host_.states;
    statesReset_ = host_.statesReset;
    host_.keepsStates = false;
    rebooted_ = host_.StateRebooted();
    Check(!well_.result.is_null() && well_.closed, "no result", well_);
    if (status_ == 0) {
      Check(well_.status == 0 && well_.messages.empty(), "reports without a fault", well_);
      ++numbers_.lines;
      numbers_.calls += static_cast<int>(calls_.size());
    }
    CheckAlways(well_);
    numbers_.commands.insert(command_.name);
    return !well_.result.is_null();
  }

  /// @p fault as the answer to the call @p at of @p calls.
  static json AnswerTo(const Texts& calls, std::size_t at, const Fault& fault) {
    json answer = fault.keys;
    answer["operation"] = calls[at];
    answer["call"] = std::count(calls.begin(), Past(calls, at), calls[at]);
    return answer;
  }
  static Texts::const_iterator Past(const Texts& calls, std::size_t at) {
    return calls.begin() + static_cast<std::ptrdiff_t>(at) + 1;
  }

  void RunFault(std::size_t at, const Fault& fault) {
    std::vector<json> answers = variant_;
    answers.insert(answers.begin(), AnswerTo(calls_, at, fault));
    fault_ = answers.front().dump();
    const Outcome run = host_.Run(answers);
    ++numbers_.faults;
    const Expected expected = fault.status ? OfStatus(at, *fault.status) : OfFailure(at, fault);
    Compare(run, expected);
    CheckAlways(run);
    if (expected.callsGoOn || fault.status) return;
    // What the command still calls behind a failure can fail as well.
    const Texts made = run.Calls();
    for (std::size_t more = at + 1; more < made.size(); ++more) {
      for (const Fault& second : FaultsOf(made[more])) RunSecondFault(run, made, more, second, answers);
    }
  }

  void RunSecondFault(const Outcome& first, const Texts& made, std::size_t at, const Fault& fault,
                      std::vector<json> answers) {
    answers.insert(answers.begin() + 1, AnswerTo(made, at, fault));
    fault_ = answers[0].dump() + " and " + answers[1].dump();
    const Outcome run = host_.Run(answers);
    ++numbers_.faults;
    Check(run.Calls() == made, "calls behind the second failure", run);
    CheckAlways(run);
    Check(run.result.is_null() && !run.closed, "a result behind two failures", run);
    if (fault.thrown == "bad_alloc") {
      Check(run.status == Plinth::kFailure && !run.failure.empty(), "no memory goes unseen", run);
      return;
    }
    Texts messages = first.messages;
    if (command_.statuses == Statuses::Gathered) {
      messages.push_back(sweep::kReason);
    } else if (made[at] != "IsSoftwareOrDependent") {  // that one only asks what the first failure means
      const Texts more = sweep::ReportsOf(command_, made[at]);
      messages.insert(messages.end(), more.begin(), more.end());
    }
    Check(run.messages == messages, "expected the reports " + json(messages).dump(), run);
  }

  const std::string& StateBefore(std::size_t at) const { return at == 0 ? initial_ : states_[at - 1]; }

  Expected OfFailure(std::size_t at, const Fault& fault) {
    const std::string& operation = calls_[at];
    const sweep::Behind behind = sweep::BehindOf(command_, operation, fault.thrown);
    Expected expected{.calls = {calls_.cbegin(), Past(calls_, at)}, .state = StateBefore(at)};
    const auto changes = std::count_if(calls_.cbegin(), Past(calls_, at) - 1, GivesStatus);
    if (status_ == 1 && command_.statuses == Statuses::Shown) {
      expected.messages.assign(static_cast<std::size_t>(changes), kReboot);
    }
    if (fault.thrown == "bad_alloc" || behind == sweep::Behind::ToFramework) {
      expected.toFramework = true;
      return expected;
    }
    if (behind == sweep::Behind::GoesOn) {
      expected.callsGoOn = true;
      expected.result = true;
      return expected;
    }
    if (behind == sweep::Behind::AsksKind) expected.calls.push_back("IsSoftwareOrDependent");
    if (behind == sweep::Behind::TakesBack) {
      expected.calls.push_back("IMA_TSR_RemoveRoute");
      expected.state = initial_;
    }
    expected.result = behind == sweep::Behind::KeepsRows;
    const Texts reports = sweep::ReportsOf(command_, operation);
    Check(!reports.empty(), "no text is known for a failure of " + operation, well_);
    expected.messages.insert(expected.messages.end(), reports.begin(), reports.end());
    if (status_ == 2 && command_.statuses == Statuses::Gathered && changes > 0) {
      expected.calls.push_back("ResetAdapter");
      expected.state = statesReset_[at - 1];
    }
    return expected;
  }

  Expected OfStatus(std::size_t at, int status) {
    Expected expected{.calls = calls_, .result = true, .allChanges = status != 4};
    const bool changesMore = std::any_of(Past(calls_, at), calls_.cend(),
                                         [](const std::string& call) { return call.starts_with("Set"); });
    if (status == 4 && !changesMore) expected.state = StateBefore(at);
    if (command_.statuses == Statuses::Shown) {
      if (status == 1) expected.messages = {kReboot};
      if (status == 4) expected.messages = {kNotSupported};
      if (status == 2) expected.calls.insert(Past(expected.calls, at), "ResetAdapter");
    } else if (command_.statuses == Statuses::Gathered && status == 2) {
      expected.calls.push_back("ResetAdapter");
    }
    return expected;
  }

  void Compare(const Outcome& run, const Expected& expected) {
    Texts made = run.Calls();
    if (expected.callsGoOn) made.resize(std::min(made.size(), expected.calls.size()));
    Check(made == expected.calls, "expected the calls " + json(expected.calls).dump(), run);
    Check(run.messages == expected.messages, "expected the reports " + json(expected.messages).dump(), run);
    Check(run.result.is_null() != expected.result, expected.result ? "no result" : "a result", run);
    Check(run.closed == expected.result, "closed or not", run);
    const int status = expected.toFramework   ? Plinth::kFailure
                       : !expected.result     ? Plinth::kReported
                       : run.messages.empty() ? Plinth::kSuccess
                                              : Plinth::kResultAndReported;
    Check(run.status == status, "expected the exit status " + std::to_string(status), run);
    Check(run.failure.empty() != expected.toFramework, "the text of a failure", run);
    if (expected.state) CheckState(host_.after, *expected.state, run);
    if (expected.allChanges) CheckState(host_.StateRebooted(), rebooted_, run);
  }

  void CheckState(const std::string& kept, const std::string& expected, const Outcome& run) {
    const auto at = std::mismatch(kept.begin(), kept.end(), expected.begin(), expected.end()).first;
    const auto begin = static_cast<std::size_t>(std::max<std::ptrdiff_t>(at - kept.begin() - 40, 0));
    const auto around = [&](const std::string& text) {
      return text.substr(std::min(begin, text.size()), 120);
    };
    Check(kept == expected, "the host keeps ..." + around(kept) + "\n  instead of ..." + around(expected),
          run);
  }

  /// What holds for every run.
  void CheckAlways(const Outcome& run) {
    Check(corectl::LiveInterfaces() == 0, "interface objects are left", run);
    const std::string texts = run.out + run.err + run.failure + testing::PrintToString(run.messages) +
                              testing::PrintToString(run.trace);
    Check(texts.find(sweep::kSecret) == std::string::npos, "a secret shows", run);
    if (&run == &well_) return;
    const json document = json::parse(run.out, nullptr, false);
    Texts messages = run.messages;
    if (!run.failure.empty()) messages.push_back(run.failure);
    Check(document.is_object() && document["status"] == run.status && document["messages"] == messages &&
              document["result"].is_null() == run.result.is_null(),
          "the document", run);
  }

  void Check(bool holds, const std::string& deviation, const Outcome& run) {
    if (holds) return;
    ++numbers_.deviations;
    ADD_FAILURE() << what_ << "\n  with " << fault_ << "\n  " << deviation << "\n  status " << run.status
                  << ", reports " << json(run.messages).dump() << ' ' << run.failure << "\n  calls "
                  << json(run.trace).dump(-1, ' ', false, json::error_handler_t::replace);
  }

  const SweptCommand& command_;
  int status_;
  Numbers& numbers_;
  SweptHost host_;
  std::string what_;
  std::string fault_ = "no fault";
  std::vector<json> variant_;  ///< the answers that ask for a reset or a reboot at each change
  Outcome well_;               ///< the run without a fault
  Texts calls_;
  std::string initial_;
  std::vector<std::string> states_, statesReset_;  ///< behind each call
  std::string rebooted_;
};

TEST(Sweep, EveryCallFailsInEveryWay) {
  Numbers numbers;
  for (const SweptCommand& command : sweep::Commands()) {
    for (const std::string& line : sweep::Parts(command.lines)) {
      if (!Sweep(command, line, 0, numbers).Run()) continue;
      for (const int status : {1, 2}) Sweep(command, line, status, numbers).Run();
    }
  }
  std::printf("sweep: %zu commands, %d command lines, %d library calls, %d faults, %d deviations\n",
              numbers.commands.size(), numbers.lines, numbers.calls, numbers.faults, numbers.deviations);
  EXPECT_EQ(numbers.commands.size(), 61u);
  for (const json& node : Harness("{}")("catalogue").result) {
    const std::string path = node["path"];
    if (node["kind"] != "command" || !path.starts_with("iscsi ")) continue;
    EXPECT_NE(node["description"], "") << path;
    EXPECT_TRUE(numbers.commands.contains(path.substr(6))) << path << " is not in the table of the sweep";
  }
}

// Memory runs out

/// One command line for which allocation after allocation fails.
class Exhaustion {
 public:
  /// @p line is without "iscsi". Where @p survives, a call of the management API that fails need not end it.
  Exhaustion(const std::string& line, bool survives) : line_("iscsi " + line), survives_(survives) {}

  /// The number of allocations that failed.
  long Run() {
    Renew();
    std::vector<std::string> states = {HostRows()};
    host::SetTraceSink([&](const std::string&) { states.push_back(HostRows()); });
    Starve(0);
    host::SetTraceSink(nullptr);
    const std::string well = console_->out.text;
    Check(record_.status == Plinth::kSuccess, console_->error.text);
    for (failed_ = 1;; ++failed_) {
      if (HostRows() != states.front()) Renew();
      const bool escaped = !Starve(failed_);
      if (!happened_) return failed_ - 1;
      Check(std::count(states.begin(), states.end(), HostRows()) != 0,
            "the host is neither as before nor as after a change");
      Check(corectl::LiveInterfaces() == 0, "interface objects are left");
      Check(ima::OutstandingAllocations() == 0, "memory of the management API is left");
      Check(!escaped, "the failure leaves the framework");
      const bool failedWhole = record_.status == Plinth::kFailure && !record_.failure.empty();
      const bool reported = record_.status == Plinth::kReported && !record_.messages.empty();
      const bool unharmed = record_.status == Plinth::kSuccess && (console_->out.text == well || survives_);
      Check(
          failedWhole || reported || unharmed || (survives_ && record_.status == Plinth::kResultAndReported),
          "status " + std::to_string(record_.status) + ' ' + record_.failure + json(record_.messages).dump() +
              console_->out.text);
    }
  }

 private:
  void Renew() {
    host_ = nullptr;
    host_ = std::make_unique<Harness>(sweep::HostDescription());
    host::SetTraceSink(nullptr);  // what the trace needs of memory is not the program's
  }

  /// Runs the line with allocation @p number failing. False where the failure comes out of the framework.
  bool Starve(long number) {
    std::istringstream line(line_);
    const std::vector<std::string> words{std::istream_iterator<std::string>(line), {}};
    console_ = std::make_unique<Plinth::TextConsole>();
    // The standard files of the process take no memory.
    console_->out.text.reserve(std::size_t{1} << 16);
    console_->error.text.reserve(std::size_t{1} << 12);
    record_ = {};
    // What the simulated host does in a transaction is its own: the answers let that fail as a whole.
    const FailingAllocation failing(number,
                                    [] { return host::Host::Current().GetStore().IsInTransaction(); });
    bool held = true;
    try {
      record_ = Plinth::RunCommandLine(CommandTree(), words, *console_, {.checked = true});
    } catch (const std::bad_alloc&) {
      held = false;
    }
    happened_ = failing.HasHappened();
    return held;
  }

  void Check(bool holds, const std::string& deviation) const {
    EXPECT_TRUE(holds) << line_ << " with allocation " << failed_ << " failing: " << deviation;
  }

  std::string line_;
  bool survives_;
  long failed_ = 0;
  std::unique_ptr<Harness> host_;
  std::unique_ptr<Plinth::TextConsole> console_;
  Plinth::RunRecord record_;
  bool happened_ = false;
};

TEST(Sweep, EveryAllocationFails) {
  // A call of the management API that fails need not end these.
  constexpr const char* kSurviving[] = {"plugin list", "adapter discovery statictarget list",
                                        "adapter target list"};
  constexpr const char* kOthers[] = {
      "software set --enabled=false",
      "adapter list",
      "adapter set -A soft -n iqn.2026-11.org.example:n -a lab",
      "adapter param get -A soft",
      "adapter param set -A soft -k MaxCmds -v 64",
      "adapter auth chap set -A soft --authname u --secret s3cr3t-option --level required",
      "adapter discovery sendtarget list",
      "adapter discovery sendtarget add -A soft -a 192.0.2.9",
      "session remove -A soft",
      "session connection list",
      "networkportal list",
      "networkportal ipconfig set -A soft -i 192.0.2.7 -s 255.255.255.0",
      "networkportal ipv6config set -A soft -e true",
      "ibftboot get"};
  long failures = 0;
  for (const char* line : kSurviving) failures += Exhaustion(line, true).Run();
  for (const char* line : kOthers) failures += Exhaustion(line, false).Run();
  std::printf("sweep: %zu command lines, %ld allocations failed\n",
              std::size(kSurviving) + std::size(kOthers), failures);
}

}  // namespace

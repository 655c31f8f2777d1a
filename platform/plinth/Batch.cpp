#include <algorithm>
#include <chrono>
#include <deque>
#include <memory>
#include <thread>
#include <utility>

#include "plinth/LineFile.h"
#include "plinth/OpenGroup.h"
#include "plinth/OwnCommands.h"
#include "plinth/Run.h"
#include "plinth/Words.h"

namespace Plinth {

namespace {

/// How many lines are run together at the most, and for how long they may keep others waiting.
constexpr std::size_t kMostTogether = 200;
constexpr std::chrono::milliseconds kLongestTogether{100};
/// How long those others have their turn then.
constexpr std::chrono::milliseconds kPause{10};

/// What is wrong with the option in a line; null for one that a line may have.
const char* FaultInLine(const Parameter& parameter) {
  constexpr std::pair<const char*, const char*> kOfTheWhole[] = {
      {"batch", "a line of a batch cannot be one"},
      {"keep-going", "give it beside --batch; it is for all lines"},
      {"plugins", "give it beside --batch; plug-ins are loaded ahead of the first line"},
  };
  for (const auto& [name, fault] : kOfTheWhole) {
    if (name == parameter.name) return fault;
  }
  return nullptr;
}

void RefuseOfTheWhole(const OptionTable& options) {
  for (const Parameter& parameter : options.Parameters()) {
    const char* fault = options.For(parameter).given ? FaultInLine(parameter) : nullptr;
    if (fault) throw UsageError("option " + OptionName(parameter) + ": " + fault);
  }
}

/// A shell's question is answered by commands that run in a child of this process. In a batch the child would
/// have the group's open transaction too, and end it.
void RefuseQuestion(const Request& request) {
  const OwnCommand* const own = FindOwnCommand(request.path);
  if (!own || own->needs != Needs::PluginsOfLineAtCursor) return;
  throw UsageError("command " + request.path +
                   ": a shell asks it by itself; it is not for a line of a batch");
}

/// True for a line that is told by its options to show something while it runs, to ask for something, or to
/// undo what it does: the lines ahead of it are answered first.
bool StandsAlone(const Request& request, const Request& whole) {
  for (const char* name : {"dry-run", "trace"}) {
    if (request.global.For(name).truth) return true;
  }
  // The whole of a group waits for others as long as the whole batch is told to.
  if (request.global.For("timeout").texts != whole.global.For("timeout").texts) return true;
  const auto isInput = [](const std::vector<std::string>& texts) {
    return std::find(texts.begin(), texts.end(), "-") != texts.end();
  };
  const auto& parameters = request.own.Parameters();
  return isInput(request.operands) ||
         std::any_of(parameters.begin(), parameters.end(),
                     [&](const Parameter& parameter) { return isInput(request.own.For(parameter).texts); });
}

/// The lines of a batch, whose own options hold for each line that does not have them itself.
class Batch {
 public:
  Batch(Run& whole, const std::string& path) : whole_(whole), file_(path) { whole.isBatch = true; }

  /// What came of the lines is shown before more of them are waited for.
  void RunLines() {
    while (Fetch()) {
      if (!whole_.console.HasReader()) return EndUnread();
      for (std::size_t count = PerformSome(); count > 0; --count) {
        const Line line = std::move(lines_.front());
        lines_.pop_front();
        const bool isShown = Show(*line.run);
        Heed(*line.run);
        if (!isShown || Ends(*line.run)) return;
      }
    }
  }

  /// All lines, as one dry run: each sees what those before it have done. Nothing is shown until that is
  /// undone, and whoever writes the lines is not waited for in the middle of it.
  void RehearseLines() {
    std::string text;
    while (file_.Next(text)) {
      if (!Take(text)) continue;
      Prepare(lines_.back());
      if (Ends(*lines_.back().run)) break;
    }
    const NoInput noInput;
    for (Line& line : lines_) {
      Perform(line);
      Heed(*line.run);
      whole_.lines.push_back(std::move(line.run));
      if (Ends(*whole_.lines.back())) return;
    }
  }

 private:
  struct Line {
    std::unique_ptr<Run> run;
    bool isPrepared = false;
    /// There is something to perform.
    bool isReady = false;
  };

  static void Prepare(Line& line) {
    if (!line.isPrepared) line.isReady = Plinth::Prepare(*line.run);
    line.isPrepared = true;
  }

  static void Perform(Line& line) {
    if (line.isReady) Plinth::Perform(*line.run);
  }

  /// Reads on where there are no lines left: waits for one, and takes those that have come with it, which can
  /// be run together. False at the end.
  bool Fetch() {
    const std::size_t most = OpenGroup::IsOffered() ? kMostTogether : 1;
    std::string text;
    while (lines_.size() < most && (lines_.empty() || file_.HasLine()) && file_.Next(text)) Take(text);
    return !lines_.empty();
  }

  /// Adds the line, unless it is empty.
  bool Take(const std::string& text) {
    AutoCli::NamespaceNode& root = *whole_.request.node;
    std::unique_ptr<Run> line(new Run{Request(root), whole_.console, whole_.options});
    line->line = file_.Number();
    line->place = file_.Name() + ':' + std::to_string(line->line);
    Request& request = line->request;
    try {
      if (text.size() > LineFile::kLongest) {
        throw UsageError("the line is longer than " + std::to_string(LineFile::kLongest) + " bytes");
      }
      const std::vector<std::string> words = SplitWords(text);
      if (words.empty()) return false;
      request = ReadRequest(root, words);
      RefuseOfTheWhole(request.global);
      RefuseQuestion(request);
    } catch (const UsageError& error) {
      request.status = kUsage;
      request.fault = error.what();
    }
    for (const Parameter& parameter : request.global.Parameters()) {
      if (!FaultInLine(parameter)) request.global.Inherit(parameter.name, whole_.request.global);
    }
    lines_.push_back({std::move(line)});
    return true;
  }

  /// Performs the first lines, at least one: how many. All that they have changed is durable.
  std::size_t PerformSome() {
    std::size_t together = 0;
    while (alone_ == 0 && together < lines_.size() &&
           !StandsAlone(lines_[together].run->request, whole_.request)) {
      Prepare(lines_[together]);
      if (Ends(*lines_[together++].run)) break;
    }
    if (together > 1) {
      const std::size_t count = PerformTogether(together);
      if (count > 0) return count;
      alone_ = together;
    }
    if (alone_ > 0) --alone_;
    Prepare(lines_.front());
    Perform(lines_.front());
    return 1;
  }

  /// Performs as many of the first @p together lines as the time allows: how many; none where what they have
  /// changed could not be made durable.
  std::size_t PerformTogether(std::size_t together) {
    const auto until = std::chrono::steady_clock::now() + kLongestTogether;
    const auto isOver = [&] { return std::chrono::steady_clock::now() >= until; };
    std::size_t count = 0;
    OpenGroup group;
    do {
      Perform(lines_[count++]);
    } while (count < together && group.IsOpen() && !Ends(*lines_[count - 1].run) && !isOver());
    const bool isCut = isOver();
    if (Commit(group)) {
      if (isCut) std::this_thread::sleep_for(kPause);
      return count;
    }
    while (count > 0) Forget(lines_[--count]);
    return 0;
  }

  bool Commit(OpenGroup& group) {
    bool isDurable = false;
    const Rest commit = [&] { isDurable = group.Commit(); };
    const Given& timeout = whole_.request.global.For("timeout");
    timeout.given ? LimitWaiting(whole_, timeout, commit) : commit();
    return isDurable;
  }

  /// What a line has answered does not hold, for it was undone.
  static void Forget(Line& line) {
    if (!line.isReady) return;
    line.run->record = {};
    line.run->record.path = line.run->request.path;
  }

  /// The batch is told by the first of its lines that fails.
  void Heed(const Run& line) {
    if (whole_.record.status == kSuccess) whole_.record.status = line.record.status;
    whole_.record.isUnread = line.record.isUnread;
  }

  /// Nothing is done any more that nobody would be told of.
  void EndUnread() {
    if (whole_.record.status == kSuccess) whole_.record.status = kFailure;
    whole_.record.isUnread = true;
  }

  bool Ends(const Run& line) const {
    return line.record.status != kSuccess && !whole_.request.global.For("keep-going").truth;
  }

  Run& whole_;
  LineFile file_;
  /// Read, and not answered yet.
  std::deque<Line> lines_;
  /// So many of them are performed each by itself, as their changes could not be kept together.
  std::size_t alone_ = 0;
};

}  // namespace

void CheckBatch(Run& run, const Given&) {
  const Request& request = run.request;
  if (!request.path.empty() || AutoCli::NodeData::Of(*request.node).isCommand) {
    throw UsageError("option --batch: give no command beside it; they stand in the file");
  }
  if (request.global.For("secret-file").given) {
    throw UsageError("option --secret-file: give it in the line of its command; it is not for a whole batch");
  }
}

void CheckKeepGoing(Run& run, const Given&) {
  if (!run.request.global.For("batch").given)
    throw UsageError("option --keep-going: it goes with --batch alone");
}

void RunBatch(Run& run, const Given& given, const Rest&) {
  Batch batch(run, given.texts.front());
  run.request.global.For("dry-run").truth ? batch.RehearseLines() : batch.RunLines();
}

}  // namespace Plinth

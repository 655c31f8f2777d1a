#include <memory>
#include <utility>

#include "plinth/LineFile.h"
#include "plinth/Run.h"
#include "plinth/Words.h"

namespace Plinth {

namespace {

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

/// The lines of a batch, whose own options hold for each line that does not have them itself.
class Batch {
 public:
  Batch(Run& whole, const std::string& path) : whole_(whole), file_(path) { whole.isBatch = true; }

  /// One line after the other: what came of it is shown before the next one is read.
  void RunLines() {
    while (const auto line = Next()) {
      if (Prepare(*line)) Perform(*line);
      const bool isShown = Show(*line);
      Heed(*line);
      if (!isShown || Ends(*line)) return;
    }
  }

  /// All lines, as one dry run: each sees what those before it have done. Nothing is shown until that is
  /// undone, and whoever writes the lines is not waited for in the middle of it.
  void RehearseLines() {
    std::vector<std::unique_ptr<Run>> lines;
    std::vector<bool> isReady;
    while (auto line = Next()) {
      isReady.push_back(Prepare(*line));
      lines.push_back(std::move(line));
      if (Ends(*lines.back())) break;
    }
    const NoInput noInput;
    for (std::size_t index = 0; index < lines.size(); ++index) {
      Run& line = *lines[index];
      if (isReady[index]) Perform(line);
      Heed(line);
      whole_.lines.push_back(std::move(lines[index]));
      if (Ends(line)) return;
    }
  }

 private:
  /// The next line that is not empty; null at the end.
  std::unique_ptr<Run> Next() {
    AutoCli::NamespaceNode& root = *whole_.request.node;
    std::string text;
    while (file_.Next(text)) {
      std::unique_ptr<Run> line(new Run{Request(root), whole_.console, whole_.options});
      line->line = file_.Number();
      line->place = file_.Name() + ':' + std::to_string(line->line);
      Request& request = line->request;
      try {
        const std::vector<std::string> words = SplitWords(text);
        if (words.empty()) continue;
        request = ReadRequest(root, words);
        RefuseOfTheWhole(request.global);
      } catch (const UsageError& error) {
        request.status = kUsage;
        request.fault = error.what();
      }
      for (const Parameter& parameter : request.global.Parameters()) {
        if (!FaultInLine(parameter)) request.global.Inherit(parameter.name, whole_.request.global);
      }
      return line;
    }
    return nullptr;
  }

  /// The batch is told by the first of its lines that fails.
  void Heed(const Run& line) {
    if (whole_.record.status == kSuccess) whole_.record.status = line.record.status;
    whole_.record.isUnread = line.record.isUnread;
  }

  bool Ends(const Run& line) const {
    return line.record.status != kSuccess && !whole_.request.global.For("keep-going").truth;
  }

  Run& whole_;
  LineFile file_;
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

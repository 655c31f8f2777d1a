#include <Plinth/Rehearsal.h>

#include <optional>
#include <utility>
#include <vector>

#include "plinth/Run.h"

namespace Plinth {

namespace {

std::vector<Rehearsal*>& Rehearsals() {
  static std::vector<Rehearsal*> rehearsals;
  return rehearsals;
}

/// While one lives, nothing that commands do lasts.
class Rehearsing {
 public:
  Rehearsing() {
    begun_.reserve(Rehearsals().size());
    try {
      for (Rehearsal* rehearsal : Rehearsals()) {
        rehearsal->Begin();
        begun_.push_back(rehearsal);
      }
    } catch (...) {
      End();
      throw;
    }
    current = this;
  }
  Rehearsing(const Rehearsing&) = delete;
  Rehearsing& operator=(const Rehearsing&) = delete;
  ~Rehearsing() {
    current = nullptr;
    End();
  }

  static bool IsOn() { return current != nullptr; }

  /// Of the rehearsals that were begun: a command may have loaded one since.
  static std::vector<std::string> TakeCalls() {
    std::vector<std::string> calls;
    for (Rehearsal* rehearsal : current->begun_) {
      for (std::string& call : rehearsal->TakeCalls()) calls.push_back(std::move(call));
    }
    return calls;
  }

 private:
  void End() {
    for (Rehearsal* rehearsal : begun_) rehearsal->End();
  }

  static inline const Rehearsing* current = nullptr;
  std::vector<Rehearsal*> begun_;
};

}  // namespace

void AddRehearsal(Rehearsal& rehearsal) { Rehearsals().push_back(&rehearsal); }

bool IsRehearsing() { return Rehearsing::IsOn(); }

bool CanRehearse() { return !Rehearsals().empty(); }

namespace {

bool LooksOutItself(const Run& run) {
  const std::string* const what = FindValue(AutoCli::NodeData::Of(*run.request.node).metaData, "dry-run");
  return what && *what == "heeded";
}

}  // namespace

void CheckDryRun(Run& run, const Given& given) {
  if (!given.truth && Rehearsing::IsOn()) {
    throw UsageError("option --dry-run: the whole batch is a dry run, and a line of it cannot be for real");
  }
  if (given.truth && !CanRehearse() && !LooksOutItself(run)) {
    throw UsageError(
        "option --dry-run: no plug-in that is loaded can undo what commands do; nothing was run");
  }
}

void DryRun(Run& run, const Given& given, const Rest& rest) {
  if (!given.truth) return rest();
  // The lines of a batch that is rehearsed as a whole find it begun.
  std::optional<Rehearsing> rehearsing;
  if (!Rehearsing::IsOn()) rehearsing.emplace();
  rest();
  if (run.record.executed) run.calls = Rehearsing::TakeCalls();
  run.record.notes.clear();  // what they tell of is undone
}

}  // namespace Plinth

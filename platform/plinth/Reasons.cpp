#include "plinth/Reasons.h"

#include <stdlib.h>

#include <algorithm>
#include <new>
#include <utility>

#include "plinth/Text.h"

namespace Plinth {

namespace {

ReasonSource* reasonSource = nullptr;

bool Contains(const std::string& text, const std::string& part) { return text.find(part) != text.npos; }

bool IsTold(const RunRecord& record, const std::string& reason) {
  return Contains(record.failure, Visible(reason)) ||
         std::any_of(record.messages.begin(), record.messages.end(),
                     [&](const std::string& message) { return Contains(message, reason); });
}

bool WantsExitCodes(const Run& run) {
  const Given& given = run.request.global.For("exit-codes");
  if (given.given) return given.truth;
  const char* variable = getenv("HCLI_EXIT_CODES");
  bool isWanted = false;
  return variable && ReadTruth(variable, isWanted) && isWanted;
}

}  // namespace

ReasonSource* SetReasonSource(ReasonSource* source) { return std::exchange(reasonSource, source); }

void BeginReasons() noexcept try {
  if (reasonSource) reasonSource->BeginRun();
} catch (const std::bad_alloc&) {
}

void TakeReason(RunRecord& record) noexcept try {
  if (!reasonSource) return;
  if (std::optional<Reason> reason = reasonSource->TakeFailure()) {
    record.reasons.push_back(*std::move(reason));
  }
} catch (const std::bad_alloc&) {
}

void TakeNotes(RunRecord& record) noexcept try {
  if (reasonSource) record.notes = reasonSource->TakeNotes();
} catch (const std::bad_alloc&) {
}

void ApplyExitCodes(Run& run) {
  RunRecord& record = run.record;
  if (record.reasons.empty() || !WantsExitCodes(run)) return;
  const auto code =
      std::find_if(std::begin(kReasonCodes), std::end(kReasonCodes),
                   [&](const ReasonCode& known) { return known.name == record.reasons.front().code; });
  record.status = code == std::end(kReasonCodes) ? kReasonCodes[0].exitStatus : code->exitStatus;
}

void WriteReasons(const Run& run, Sink& error) {
  const RunRecord& record = run.record;
  for (const Reason& reason : record.reasons) {
    if (!IsTold(record, reason.text)) error.Write("hcli: reason: " + Visible(reason.text) + '\n');
  }
  if (IsQuiet(run)) return;
  for (const std::string& note : record.notes) error.Write("hcli: note: " + Visible(note) + '\n');
}

}  // namespace Plinth

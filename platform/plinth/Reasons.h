/// Reasons and notes of a run, and exit statuses that tell reasons apart.
#pragma once

#include "plinth/Run.h"

namespace Plinth {

// What Execute tells as the command runs. Where memory runs out, reasons and notes are left out.

/// A command begins to run.
void BeginReasons() noexcept;
/// The command has reported something, or ended in a failure: what failed last is the reason.
void TakeReason(RunRecord& record) noexcept;
/// The command has ended.
void TakeNotes(RunRecord& record) noexcept;

/// Gives a run that was reported of, or failed, the exit status of its first reason, where the user wants
/// that: by --exit-codes, else by HCLI_EXIT_CODES=1.
void ApplyExitCodes(Run& run);

/// Writes the reasons and notes as lines, but for reasons that the command itself has told, and for notes
/// where --quiet is given.
void WriteReasons(const Run& run, Sink& error);

}  // namespace Plinth

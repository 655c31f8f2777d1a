/// The options that every command line may have, and what each changes about a run.
#pragma once

#include <functional>
#include <span>
#include <vector>

#include "plinth/Declarations.h"
#include "plinth/Options.h"

namespace Plinth {

struct Run;

/// What is still to be done of a run. Throws nothing but std::bad_alloc: what a command throws is in the
/// record of the run.
using Rest = std::function<void()>;

/// A global option. What it does stands in a file of its own. Both stages may throw UsageError, and both may
/// be null: options of how to show a result are looked up when it is shown.
struct GlobalOption {
  const char* name;
  CallSpec::ParameterType type;
  /// One letter, or empty.
  const char* letter;
  const char* help;
  /// The values that it may have; null where any goes.
  std::vector<std::string> (*values)();
  /// Where the option is given: before the command's own options are looked at as a whole, and before secrets
  /// are asked for. May look at what was asked, and change it.
  void (*prepare)(Run& run, const Given& given);
  /// Where the option is given: around the command, with nothing more to read. Does without it by not calling
  /// @p rest.
  void (*around)(Run& run, const Given& given, const Rest& rest);
};

/// All of them, in the order that help shows. Stages are entered in this order.
std::span<const GlobalOption> GlobalOptions();
/// The same as parameters.
[[gnu::visibility("default")]] std::vector<Parameter> GlobalParameters();

/// --fields: holds the fields that the user named against those that the command declares.
void ChooseFields(Run& run, const Given& given);
/// --typed: refuses forms that have texts alone.
void CheckTyped(Run& run, const Given& given);
/// --trace: shows the calls of the host's libraries for as long as the command runs.
void Trace(Run& run, const Given& given, const Rest& rest);
/// --dry-run: undoes what the command has done, and keeps what that was. Where no platform can undo, it is
/// refused, but for commands that look out for it themselves.
bool CanRehearse();
void CheckDryRun(Run& run, const Given& given);
void DryRun(Run& run, const Given& given, const Rest& rest);
/// --timeout: how long library calls wait for other processes.
void CheckTimeout(Run& run, const Given& given);
void LimitWaiting(Run& run, const Given& given, const Rest& rest);
/// --batch: runs the command lines of a file in place of the one here.
void CheckBatch(Run& run, const Given& given);
void RunBatch(Run& run, const Given& given, const Rest& rest);
/// --keep-going: goes with --batch alone.
void CheckKeepGoing(Run& run, const Given& given);
/// --secret-file: marks the command's one secret as still to be read.
void ExpectSecretFile(Run& run, const Given& given);

}  // namespace Plinth

#include "plinth/Run.h"

#include <algorithm>
#include <stdexcept>

#include "plinth/Failure.h"
#include "plinth/Formatter.h"
#include "plinth/Help.h"
#include "plinth/InputOutput.h"
#include "plinth/Reasons.h"
#include "plinth/Text.h"

namespace Plinth {

using AutoCli::Command;

namespace {

std::string Named(const Run& run, const std::string& text) {
  return run.record.path.empty() ? text : run.record.path + ": " + text;
}

/// Holds the command to what it declares.
void CheckRun(Command& command, const Run& run) {
  const std::string& format = AutoCli::NodeData::Of(command).formatter;
  if (!format.empty() && !FindFormatter(format)) {
    RaiseFault(true, Named(run, "the command's default format " + Quoted(format) + " is none"));
  }
  if (!run.record.result) return;
  if (!run.record.closed) {
    RaiseFault(true, Named(run, "the command posts a result and does not close its output"));
  }
  const std::string difference = CheckResult(PrototypeOf(*command.GetOutputSpec()).get(), *run.record.result);
  if (!difference.empty()) RaiseFault(true, Named(run, difference));
}

void Execute(Command& command, Run& run) {
  RunRecord& record = run.record;
  record.executed = true;
  BeginReasons();
  try {
    const boost::shared_ptr<CallSpec::Input> input(new RunInput(run.request.own, run.options.checked));
    const boost::shared_ptr<CallSpec::Output> output(new RunOutput(record, run.options.checked));
    command.Execute(input, output);
    if (run.options.checked) CheckRun(command, run);
  } catch (...) {
    Fail(run, kFailure, CurrentExceptionText());
  }
  if (record.failure.empty() && !record.result && record.messages.empty()) {
    Fail(run, kFailure, "the command ended with neither a result nor a report");
  }
  TakeNotes(record);
  if (!record.failure.empty()) return TakeReason(record);
  record.status = !record.result ? kReported : record.messages.empty() ? kSuccess : kResultAndReported;
}

void ShowText(Run& run, const std::string& text) { run.text = MetaObj::MetaString::New(text); }

void ShowHelp(Run& run) {
  const std::size_t columns = run.console.OutScreen().columns;
  // Longer lines are hard to read, and shorter ones hold no option.
  const std::size_t screen = columns == 0 ? 80 : std::clamp<std::size_t>(columns, 40, 120);
  // In the middle of a batch, the host is in use.
  Place place{*run.request.start, *run.request.node, run.request.path, run.line == 0};
  for (const Parameter& parameter : run.request.own.Parameters()) {
    if (parameter.sensitive) continue;
    for (const std::string& text : run.request.own.For(parameter).texts) {
      place.options.push_back("--" + parameter.name + '=' + text);
    }
  }
  ShowText(run, HelpText(place, screen));
}

/// Enters the stage of each option that is given, from the one at @p index on, and @p last within them.
void Surround(Run& run, std::size_t index, const Rest& last) {
  for (; index < GlobalOptions().size(); ++index) {
    const GlobalOption& option = GlobalOptions()[index];
    const Given& given = run.request.global.For(option.name);
    if (!option.around || !given.given) continue;
    return option.around(run, given, [&] { Surround(run, index + 1, last); });
  }
  last();
}

/// False where nothing is left to perform.
bool PrepareParts(Run& run) {
  Request& request = run.request;
  if (request.status != kSuccess) {
    Fail(run, request.status, request.fault);
    return false;
  }
  if (request.global.For("version").truth) {
    ShowText(run, "hcli " HCLI_VERSION "\n");
    return false;
  }
  if (request.isHelp || request.global.For("help").truth) {
    ShowHelp(run);
    return false;
  }
  for (const GlobalOption& option : GlobalOptions()) {
    const Given& given = request.global.For(option.name);
    if (option.prepare && given.given) option.prepare(run, given);
  }
  if (AutoCli::NodeData::Of(*request.node).isCommand) {
    Complete(request);
    ReadSecrets(run);
  }
  return true;
}

/// Lets what @p step throws be the end of the run.
template <class Step>
void Attempt(Run& run, Step step) {
  try {
    step();
  } catch (const UsageError& error) {
    Fail(run, kUsage, error.what());
  } catch (...) {
    Fail(run, kFailure, CurrentExceptionText());
  }
}

}  // namespace

bool Prepare(Run& run) {
  run.record.path = run.request.path;
  bool goesOn = false;
  Attempt(run, [&] { goesOn = PrepareParts(run); });
  return goesOn;
}

void Perform(Run& run) {
  auto* const command = dynamic_cast<Command*>(run.request.node);
  Attempt(run, [&] { Surround(run, 0, [&] { command ? Execute(*command, run) : ShowHelp(run); }); });
  ApplyExitCodes(run);
}

void Fail(Run& run, int status, const std::string& text) {
  run.record.status = status;
  run.record.failure = Visible(text);
}

}  // namespace Plinth

#include <cerrno>
#include <cstring>

#include "plinth/Formatter.h"
#include "plinth/Reasons.h"
#include "plinth/Run.h"
#include "plinth/Text.h"
#include "plinth/Tty.h"

namespace Plinth {

namespace {

/// A result that says no more than that all went well.
bool IsPlainSuccess(const MetaObj::MetaObject& result) {
  const auto* const truth = dynamic_cast<const MetaObj::MetaBool*>(&result);
  const auto* const text = dynamic_cast<const MetaObj::MetaString*>(&result);
  return (truth && truth->HasValue() && truth->GetValue()) ||
         (text && text->HasValue() && text->GetValue().empty());
}

/// What stands above all that a line of a batch shows, on a terminal above its reports too.
void WriteHeading(const Run& run) {
  const RunRecord& record = run.record;
  const Form form = ChosenFormatter(run).form;
  const bool hasResult = form == Form::Text && record.failure.empty() && (run.text || record.result);
  if (run.line == 0 || IsQuiet(run) || form == Form::Document || (!hasResult && !run.calls)) return;
  Sink& sink = form == Form::Records ? run.console.Error() : run.console.Out();
  sink.Write("line " + std::to_string(run.line) + (record.path.empty() ? "" : ": " + record.path) + '\n');
  if (record.status != kSuccess || !record.notes.empty()) sink.Flush();
}

void WriteCalls(const Run& run, Sink& sink) {
  if (!run.calls) return;
  for (const std::string& call : *run.calls) sink.Write("dry run: " + Visible(call) + '\n');
  if (run.calls->empty()) sink.Write("dry run: nothing would change\n");
}

void WriteMessages(const Run& run, Sink& error) {
  const RunRecord& record = run.record;
  const bool isFailed = record.status != kSuccess && record.status != kResultAndReported;
  const bool isColored = isFailed && IsColored(run, run.console.IsErrorTerminal());
  if (isColored) error.Write(kFailed);
  for (const std::string& message : record.messages) {
    error.Write(Visible(message, Lines::Kept));
    if (message.empty() || message.back() != '\n') error.Write("\n");
  }
  if (!record.failure.empty()) error.Write("hcli: " + record.failure + '\n');
  WriteReasons(run, error);
  if (!run.place.empty() && record.status != kSuccess) {
    error.Write("hcli: " + Visible(run.place) + ": exit status " + std::to_string(record.status) + '\n');
  }
  if (isColored) error.Write(kPlain);
  if (ChosenFormatter(run).form == Form::Records) WriteCalls(run, error);
  error.Flush();
}

void WriteResult(const Run& run, Sink& out) {
  const boost::shared_ptr<MetaObj::MetaObject> result = run.text ? run.text : TypedResult(run);
  Report report;
  report.status = run.record.status;
  report.messages = run.record.messages;
  if (!run.record.failure.empty()) {
    report.messages.push_back(run.record.failure);
  } else {
    report.result = result.get();
  }
  report.reasons = run.record.reasons;
  report.notes = run.record.notes;
  const Formatter& formatter = ChosenFormatter(run);
  if (formatter.form == Form::Document) {
    report.line = run.line;
    report.calls = run.calls ? &*run.calls : nullptr;
  } else {
    if (IsQuiet(run) && report.result && IsPlainSuccess(*report.result)) report.result = nullptr;
    if (formatter.form == Form::Text) WriteCalls(run, out);
    if (!report.result) return;
  }
  report.fields = run.fields;
  report.hasHeader = !run.request.global.For("no-header").truth;
  report.width = run.console.OutScreen().columns;
  report.isColored = IsColored(run, report.width != 0);
  if (run.text && report.isColored && formatter.form != Form::Document) {
    return out.Write(WithHeadings(Visible(run.text->GetValue(), Lines::Kept)));
  }
  report.settings = AutoCli::NodeData::Of(*run.request.node).formatterParameters;
  formatter.write(report, out);
}

}  // namespace

const Formatter& ChosenFormatter(const Run& run) {
  const Given& given = run.request.global.For("output");
  const Formatter* formatter = given.given ? FindFormatter(given.texts.front()) : nullptr;
  if (!formatter && !run.text) {
    formatter = FindFormatter(AutoCli::NodeData::Of(*run.request.node).formatter);
  }
  return formatter ? *formatter : kFormatters[0];
}

bool IsQuiet(const Run& run) { return run.request.global.For("quiet").truth; }

bool Show(Run& run) {
  for (const auto& line : run.lines) {
    if (Show(*line)) continue;
    run.record.isUnread = line->record.isUnread;
    if (run.record.status == kSuccess) run.record.status = line->record.status;
    return false;
  }
  if (run.isBatch && run.record.failure.empty()) return true;
  WriteHeading(run);
  WriteMessages(run, run.console.Error());
  if (MayPage(run)) {
    TextSink text;
    WriteResult(run, text);
    WritePaged(run, text.text);
  } else {
    WriteResult(run, run.console.Out());
  }
  const int error = run.console.Out().Flush();
  if (error == 0) return true;
  Fail(run, kFailure, std::string("cannot write to standard output: ") + std::strerror(error));
  run.record.isUnread = error == EPIPE;
  if (run.record.isUnread) return false;
  run.console.Error().Write("hcli: " + run.record.failure + '\n');
  run.console.Error().Flush();
  return false;
}

}  // namespace Plinth

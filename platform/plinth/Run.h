/// One command line on its way from what was asked to what is shown.
#pragma once

#include <Plinth/MetaObj.h>

#include <boost/shared_ptr.hpp>
#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "plinth/CommandLine.h"
#include "plinth/Request.h"

namespace Plinth {

struct Formatter;

/// What is shown together: one command line, or those of a batch.
struct Run {
  Request request;
  Console& console;
  RunOptions options;
  RunRecord record = {};
  /// The fields that the user named; empty where all or the command's default are to be shown.
  std::vector<std::string> fields = {};
  /// A text to show that is no result of a command, such as help; null where there is none.
  boost::shared_ptr<MetaObj::MetaString> text = nullptr;
  /// The calls that would have changed something; absent where it was no dry run.
  std::optional<std::vector<std::string>> calls = {};
  /// The number of its line in a batch, and the line's place as messages name it; 0 and empty outside of one.
  std::size_t line = 0;
  std::string place = {};
  /// Its lines show what there is to show: those here, or lines that are shown already.
  bool isBatch = false;
  std::vector<std::unique_ptr<Run>> lines = {};
};

/// Does what stands ahead of the command: its options are read as a whole, and secrets are asked for. False
/// where the run has ended with that.
bool Prepare(Run& run);
/// Does what was asked, behind Prepare, with each global option's part in it. Nothing of what the command
/// says is written out before it has ended and all that it held is released: whoever does not read keeps
/// nobody waiting.
void Perform(Run& run);

/// The run has ended with @p text in place of a result.
void Fail(Run& run, int status, const std::string& text);

/// Reads each secret that is still to be read: from the file of --secret-file, or else from standard input.
void ReadSecrets(Run& run);

/// --quiet: the user wants neither notes nor a result that says no more than that all went well.
bool IsQuiet(const Run& run);

/// The form in which the run is shown: the one that the user names, else the command's own.
const Formatter& ChosenFormatter(const Run& run);
/// The result as it is to be shown: with --typed, its texts read. Null where there is none.
boost::shared_ptr<MetaObj::MetaObject> TypedResult(const Run& run);

/// Writes out what came of the run: reports, the text of a failure, the result. False where standard output
/// takes no more, which is a failure of the run.
bool Show(Run& run);

}  // namespace Plinth

#include "plinth/CommandLine.h"

#include <new>
#include <utility>

#include "plinth/Failure.h"
#include "plinth/Run.h"

namespace Plinth {

bool IsCheckedBuild() {
#ifdef HCLI_CHECKED
  return true;
#else
  return false;
#endif
}

RunRecord OutOfMemory(Console& console) {
  RunRecord record;
  record.status = kFailure;
  record.failure = kOutOfMemory;  // short enough for a string to hold by itself
  console.Error().Write("hcli: ");
  console.Error().Write(kOutOfMemory);
  console.Error().Write("\n");
  console.Error().Flush();
  return record;
}

namespace {

RunRecord RunFrom(AutoCli::NamespaceNode& start, const std::vector<std::string>& arguments, Console& console,
                  RunOptions options) try {
  Run run{ReadRequest(start, arguments), console, options};
  if (Prepare(run)) Perform(run);
  Show(run);
  return std::move(run.record);
} catch (const std::bad_alloc&) {
  return OutOfMemory(console);
}

}  // namespace

RunRecord RunCommandLine(AutoCli::Namespace& root, const std::vector<std::string>& arguments,
                         Console& console, RunOptions options) {
  return RunFrom(root, arguments, console, options);
}

RunRecord RunCommand(AutoCli::Command& command, const std::vector<std::string>& arguments, Console& console,
                     RunOptions options) {
  return RunFrom(command, arguments, console, options);
}

}  // namespace Plinth

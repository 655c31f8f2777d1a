#include <fcntl.h>
#include <signal.h>
#include <stdlib.h>

#include <new>
#include <optional>

#include "plinth/CommandLine.h"
#include "plinth/Failure.h"
#include "plinth/GlobalOptions.h"
#include "plinth/Guide.h"
#include "plinth/Options.h"
#include "plinth/OwnCommands.h"
#include "plinth/Shells.h"

namespace Plinth {

namespace {

/// What is told by the options in front of the first word, and by that word itself.
struct Beginning {
  std::optional<std::string> folder;  // of --plugins
  std::string word;                   // empty where there is none
  bool isAlone = false;               // the command there needs no plug-ins
};

/// The folder is needed before there is a tree to resolve the words in, and without them an option cannot be
/// told from another one's value: so it counts in front of the first word alone.
Beginning BeginningOf(const std::vector<std::string>& arguments) {
  Beginning beginning;
  if (arguments.empty()) return beginning;
  if (!IsOption(arguments.front())) return {.folder = {}, .word = arguments.front()};
  OptionTable global(GlobalParameters());
  std::size_t at = 0;
  try {
    while (at < arguments.size() && IsOption(arguments[at]) && arguments[at] != "--") {
      ReadOption(arguments, at, {&global});
    }
    if (at < arguments.size() && arguments[at] != "--") beginning.word = arguments[at];
  } catch (const UsageError&) {
    // It will be told when the whole line is read.
  }
  const Given& given = global.For("plugins");
  if (given.given) beginning.folder = given.texts.front();
  return beginning;
}

/// What plug-ins to load, and where from.
Beginning PluginsFor(const std::vector<std::string>& arguments) {
  Beginning beginning = BeginningOf(arguments);
  const OwnCommand* const own = FindOwnCommand(beginning.word);
  if (!own || own->needs == Needs::AllPlugins) return beginning;
  beginning.isAlone = own->needs == Needs::NoPlugins;
  if (beginning.isAlone) return beginning;
  Beginning asked = BeginningOf(LineAtCursor().words);
  if (!asked.folder) asked.folder = std::move(beginning.folder);
  return asked;
}

/// A file opened later must not take the number of a standard file that is closed: results would be written
/// into it.
void HoldStandardFiles() {
  for (int descriptor = 0; descriptor < 3; ++descriptor) {
    // Opened for the other direction, so that using it fails as using the closed one would.
    if (fcntl(descriptor, F_GETFD) == -1) open("/dev/null", descriptor == 0 ? O_WRONLY : O_RDONLY);
  }
}

/// Loads what @p beginning asks for. @p folder is where plug-ins lie when nothing names another.
void LoadPluginsFor(const Beginning& beginning, const std::string& folder, AutoCli::Namespace& root,
                    Console& console) {
  if (beginning.isAlone) return;
  const char* given = beginning.folder ? beginning.folder->c_str() : getenv("HCLI_PLUGINS");
  const bool named = beginning.folder || (given && *given);
  for (const std::string& trouble :
       LoadPlugins(root, named ? given : folder, named ? PluginFolder::Named : PluginFolder::BuiltIn,
                   beginning.word)) {
    console.Error().Write("hcli: " + trouble + '\n');
  }
  console.Error().Flush();
}

RunRecord RunWithPlugins(const std::vector<std::string>& arguments, const std::string& folder,
                         Console& console) {
  // Kept to the end of the process, where nobody waits for the tree to be taken apart.
  static const auto& root = *new auto(AutoCli::Namespace::New());
  LoadPluginsFor(PluginsFor(arguments), folder, *root, console);
  RegisterOwnCommands(*root);
  return RunCommandLine(*root, arguments, console);
}

}  // namespace

int RunProgram(const std::vector<std::string>& arguments, const std::string& folder) {
  HoldStandardFiles();
  // Neither a closed pipe nor a file that may not grow ends a command in the middle of its work.
  const auto whenUnread = signal(SIGPIPE, SIG_IGN);
  signal(SIGXFSZ, SIG_IGN);

  ProcessConsole console;
  try {
    // Beside the program's own plug-ins, wherever others lie: who runs the program trusts what lies there.
    if (!folder.empty()) SetGuideFolder(folder + "/../../../share/hcli/guides");
    // Kept as the tree is: a result of thousands of rows takes a tenth of the run to take apart.
    static const RunRecord& record = *new RunRecord(RunWithPlugins(arguments, folder, console));
    if (record.isUnread) {
      // The end that the signal brings to other programs, now that the work is done.
      signal(SIGPIPE, whenUnread);
      raise(SIGPIPE);
    }
    return record.status;
  } catch (const std::bad_alloc&) {
    return OutOfMemory(console).status;
  }
}

}  // namespace Plinth

#include <fcntl.h>
#include <signal.h>
#include <stdlib.h>

#include <new>
#include <optional>

#include "plinth/CommandLine.h"
#include "plinth/Failure.h"
#include "plinth/Options.h"

namespace Plinth {

namespace {

/// The folder that --plugins names. It is needed before there is a tree to resolve the words in, and without
/// them an option cannot be told from another one's value: so it counts in front of the first word alone.
std::optional<std::string> NamedFolder(const std::vector<std::string>& arguments) {
  OptionTable global(GlobalParameters());
  try {
    for (std::size_t at = 0; at < arguments.size() && IsOption(arguments[at]) && arguments[at] != "--";) {
      ReadOption(arguments, at, {&global});
    }
  } catch (const UsageError&) {
    // It will be told when the whole line is read.
  }
  const Given& given = global.For("plugins");
  return given.given ? std::optional(given.texts.front()) : std::nullopt;
}

/// A file opened later must not take the number of a standard file that is closed: results would be written
/// into it.
void HoldStandardFiles() {
  for (int descriptor = 0; descriptor < 3; ++descriptor) {
    // Opened for the other direction, so that using it fails as using the closed one would.
    if (fcntl(descriptor, F_GETFD) == -1) open("/dev/null", descriptor == 0 ? O_WRONLY : O_RDONLY);
  }
}

int RunWithPlugins(const std::vector<std::string>& arguments, const std::string& folder, PluginFolder whose,
                   Console& console) {
  // Kept to the end of the process, where nobody waits for the tree to be taken apart.
  static const auto& root = *new auto(AutoCli::Namespace::New());
  for (const std::string& trouble : LoadPlugins(*root, folder, whose)) {
    console.Error().Write("hcli: " + trouble + '\n');
  }
  console.Error().Flush();
  RegisterOwnCommands(*root);
  return RunCommandLine(*root, arguments, console).status;
}

}  // namespace

int RunProgram(const std::vector<std::string>& arguments, const std::string& folder) {
  HoldStandardFiles();
  // A closed pipe and a file that may not grow are told as any other failure to write.
  signal(SIGPIPE, SIG_IGN);
  signal(SIGXFSZ, SIG_IGN);

  ProcessConsole console;
  try {
    const std::optional<std::string> early = NamedFolder(arguments);
    const char* given = early ? early->c_str() : getenv("HCLI_PLUGINS");
    const bool named = early || (given && *given);
    return RunWithPlugins(arguments, named ? given : folder,
                          named ? PluginFolder::Named : PluginFolder::BuiltIn, console);
  } catch (const std::bad_alloc&) {
    return OutOfMemory(console).status;
  }
}

}  // namespace Plinth

/// Runs one command line against a command tree.
#pragma once

#include <Plinth/AutoCli.h>
#include <Plinth/MetaObj.h>
#include <Plinth/Reasons.h>

#include <boost/shared_ptr.hpp>
#include <string>
#include <vector>

#include "plinth/Console.h"

#pragma GCC visibility push(default)

namespace Plinth {

/// How a run ended, as the process tells it.
enum ExitStatus : int {
  kSuccess = 0,
  kReported = 1,
  kUsage = 2,
  kResultAndReported = 3,
  kFailure = 4,
  // Those of kReasonCodes follow, from 10 on.
};

/// What happened in a run.
struct RunRecord {
  int status = kSuccess;
  /// The words that lead to the node that was reached, blanks between.
  std::string path;
  /// The command's Execute was entered.
  bool executed = false;
  /// What the command posted; null where it posted nothing.
  boost::shared_ptr<MetaObj::MetaObject> result;
  /// What the command reported, in order and to the letter.
  std::vector<std::string> messages;
  /// The command closed its output.
  bool closed = false;
  /// The text of a usage error (status 2) or of a failure of the program (status 4), else empty.
  std::string failure;
  /// Nobody reads standard output any more: a failure, but one that is not told.
  bool isUnread = false;
  /// Why the library calls failed behind what was reported, in order.
  std::vector<Reason> reasons;
  /// What the calls did, or left to do, besides.
  std::vector<std::string> notes;
};

/// True where the build holds commands to what they declare.
bool IsCheckedBuild();

struct RunOptions {
  /// A command that breaks its own declarations ends the process with a message. Without, an undeclared or
  /// wrongly typed read and a wrong use of the output throw std::logic_error, and the rest goes unseen.
  bool checked = IsCheckedBuild();
};

/// Resolves the words of @p arguments (the program's name is none of them) under @p root, runs the command
/// there and shows on @p console what came of it. Throws nothing.
RunRecord RunCommandLine(AutoCli::Namespace& root, const std::vector<std::string>& arguments,
                         Console& console, RunOptions options = {});

/// The same for a command that need not stand in a tree. @p arguments are its options; global options may
/// be among them.
RunRecord RunCommand(AutoCli::Command& command, const std::vector<std::string>& arguments, Console& console,
                     RunOptions options = {});

/// Says where @p posted differs from the declared @p prototype, or "" where it fits. A structure declared
/// without fields is open: its fields are not looked at.
std::string CheckResult(const MetaObj::MetaObject* prototype, const MetaObj::MetaObject& posted);

/// Hangs the framework's own commands under @p root.
void RegisterOwnCommands(AutoCli::Namespace& root);

/// Where the name of a plug-in folder comes from: from the program's own place, or from its caller.
enum class PluginFolder { BuiltIn, Named };

/// Loads each "*.so" of @p folder in the order of the names and hangs what it registers under @p root. One
/// that cannot be loaded, or clashes with a name that is taken, leaves nothing behind. Returns a line for
/// each trouble. An empty name of a folder of its own means that nobody knows it. Of a folder that was named,
/// root loads nothing that somebody else could have put there. Files stay loaded until the process ends,
/// since the tree holds objects of theirs. Where "FIRST.so" registers the name @p first, it is the only one
/// that is loaded.
std::vector<std::string> LoadPlugins(AutoCli::Namespace& root, const std::string& folder, PluginFolder whose,
                                     const std::string& first = {});

/// The whole program: loads the plug-ins, runs the arguments and returns the exit status. @p folder is where
/// plug-ins lie when neither --plugins nor HCLI_PLUGINS names another.
int RunProgram(const std::vector<std::string>& arguments, const std::string& folder);

}  // namespace Plinth

#pragma GCC visibility pop

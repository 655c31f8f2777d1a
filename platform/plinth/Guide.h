/// What people are told about commands beyond their declarations.
///
/// A guide is a YAML file of its own, share/hcli/guides/NAME.yaml, for the plug-in file NAME.so; the
/// framework's own commands have hcli.yaml. Help, manual pages and completion read it, and plain commands
/// never do. Without it nothing but those texts is missing.
#pragma once

#include <Plinth/AutoCli.h>

#include <map>
#include <stdexcept>
#include <string>
#include <vector>

#include "plinth/Declarations.h"

#pragma GCC visibility push(default)

namespace Plinth {

/// Where values of an option come from.
struct ValueSource {
  /// The long name.
  std::string option;
  /// The command, or the namespace, that it is about; empty for every command that has the option.
  std::string of;
  /// The command that shows the values: one that only reads. Empty where the value names a file, a
  /// folder or a command.
  std::string from;
  /// The field of that command's result that holds the value.
  std::string field;
  /// The field that describes the value, or empty.
  std::string about;
  /// Options that both commands have, and that narrow down what is shown.
  std::vector<std::string> with;
  enum class Kind { Shown, File, Folder, Command } kind = Kind::Shown;
  /// Few enough, and the same for long enough, to be listed in help.
  bool isListed = false;
};

/// A command line that works on the demo host.
struct Example {
  std::string about;
  std::string line;
};

struct Guide {
  std::vector<ValueSource> values;
  /// By the words that lead to the command.
  std::map<std::string, std::vector<Example>> examples;
  /// What a result that has no fields says, likewise.
  std::map<std::string, std::string> results;
  /// What fields mean, by the type name of their structure and their own.
  std::map<std::string, std::map<std::string, std::string>> fields;
  /// Other words that results show and options take, with their meanings.
  KeyValues terms;
  /// Variables of the environment, and files, with what they are for.
  KeyValues environment;
  KeyValues files;

  /// Where the values of the option of the command at @p path come from: the source that is about the
  /// nearest place; null where nothing is known.
  const ValueSource* FindValues(const std::string& path, const std::string& option) const;
  /// None where none are known.
  const std::vector<Example>& ExamplesOf(const std::string& path) const;
  /// What the result of the command at @p path says; empty where nothing is known.
  const std::string& ResultOf(const std::string& path) const;
  /// What the field means; empty where nothing is known.
  const std::string& MeaningOf(const std::string& structure, const std::string& field) const;
};

/// The guide is wrong. The text begins with the file and the number of the line.
struct GuideError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// Reads a guide. Throws GuideError for one that is wrong, and for a file that cannot be read.
Guide ReadGuide(const std::string& file);

/// The folder that guides are in, from now on; empty, as at first, where there are none.
void SetGuideFolder(const std::string& folder);
/// All guides that are there, whether or not their plug-ins are, by name.
std::vector<std::string> GuideFiles();
/// What is wrong with them: the text of a GuideError each.
std::vector<std::string> GuideFaults();

/// The file of the guide to what stands at @p path under @p root; it need not exist. Empty where no file that
/// was loaded brings it.
std::string GuideFile(const AutoCli::NamespaceNode& root, const std::string& path);
/// The guide itself, read once a process. An empty one where there is none, or where it is wrong: help has to
/// come all the same.
const Guide& GuideTo(const AutoCli::NamespaceNode& root, const std::string& path);

}  // namespace Plinth

#pragma GCC visibility pop

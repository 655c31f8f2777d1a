/// What a command line asks for, before anything of it is done.
#pragma once

#include <Plinth/AutoCli.h>

#include <string>
#include <vector>

#include "plinth/GlobalOptions.h"
#include "plinth/Options.h"

namespace Plinth {

struct Request {
  explicit Request(AutoCli::NamespaceNode& from) : start(&from), node(&from) {}

  /// Where the words begin.
  AutoCli::NamespaceNode* start;
  /// The word "help" stands in front of the others.
  bool isHelp = false;
  /// Where the words lead; they may end at a namespace.
  AutoCli::NamespaceNode* node;
  /// The words that lead there, blanks between.
  std::string path;
  OptionTable global{GlobalParameters()};
  /// The command's own options; none at a namespace.
  OptionTable own{{}};
  /// Values without an option's name.
  std::vector<std::string> operands;
  /// The first fault of the line: kUsage, or kFailure where a command cannot say what it takes.
  int status = 0;
  std::string fault;
  /// A word leads nowhere, so nobody knows what those behind it mean.
  bool isLost = false;
  /// A "--" stands in the line: no options behind it.
  bool isOptionsEnd = false;
  /// The long name of the option whose value would have to come next, or empty.
  std::string awaited;
};

/// Reads @p arguments to their end, behind a fault too: in which form to answer may stand there.
Request ReadRequest(AutoCli::NamespaceNode& start, const std::vector<std::string>& arguments);

/// Hands the operands to the options that they are for. Throws UsageError for one too many, and where a
/// required option is missing.
void Complete(Request& request);

}  // namespace Plinth

#include "plinth/OwnCommands.h"

#include <algorithm>
#include <iterator>

#include "plinth/CommandLine.h"

namespace Plinth {

const OwnCommand* FindOwnCommand(const std::string& name) {
  const auto* const found = std::find_if(std::begin(kOwnCommands), std::end(kOwnCommands),
                                         [&](const OwnCommand& own) { return name == own.name; });
  return found == std::end(kOwnCommands) ? nullptr : found;
}

boost::shared_ptr<AutoCli::NamespaceNode> NewHelp(AutoCli::Namespace&) {
  auto help = AutoCli::Namespace::New();
  help->SetDescription("Show the help on what the words behind it lead to.");
  return help;
}

void RegisterOwnCommands(AutoCli::Namespace& root) {
  for (const OwnCommand& command : kOwnCommands) {
    root.RegisterNamespaceNode(command.make(root), command.name);
  }
}

}  // namespace Plinth

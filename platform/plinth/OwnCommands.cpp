#include "plinth/OwnCommands.h"

#include <algorithm>
#include <iterator>

#include "plinth/CommandLine.h"

namespace Plinth {

bool IsOwnCommand(const std::string& name) {
  return std::any_of(std::begin(kOwnCommands), std::end(kOwnCommands),
                     [&](const OwnCommand& own) { return name == own.name; });
}

void RegisterOwnCommands(AutoCli::Namespace& root) {
  for (const OwnCommand& command : kOwnCommands) {
    root.RegisterNamespaceNode(command.make(root), command.name);
  }
}

}  // namespace Plinth

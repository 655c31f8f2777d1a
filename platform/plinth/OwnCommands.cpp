#include "plinth/OwnCommands.h"

#include "plinth/CommandLine.h"

namespace Plinth {

void RegisterOwnCommands(AutoCli::Namespace& root) {
  for (const OwnCommand& command : kOwnCommands) {
    root.RegisterNamespaceNode(command.make(root), command.name);
  }
}

}  // namespace Plinth

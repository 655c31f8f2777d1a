#include "plinth/OwnCommands.h"

#include "plinth/CommandLine.h"

namespace Plinth {

void RegisterOwnCommands(AutoCli::Namespace& root) {
  root.RegisterNamespaceNode(NewCatalogue(root), "catalogue");
  root.RegisterNamespaceNode(NewCompletion(root), "completion");
}

}  // namespace Plinth

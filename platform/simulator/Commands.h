/// The commands `hcli simulator ...`, which show and replace the simulated host.
#pragma once

#include <Plinth/AutoCli.h>

namespace simulator {

boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewLoad();
boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewShow();
boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewPending();
boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewReset();
boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewReboot();
/// The namespace with its commands.
boost::shared_ptr<Plinth::AutoCli::Namespace> NewNamespace();

}  // namespace simulator

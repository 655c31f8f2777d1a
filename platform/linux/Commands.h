/// The commands `hcli linux ...`, which tell of this machine's own initiator.
#pragma once

#include <Plinth/AutoCli.h>

namespace linux {

boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewCheck();
boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewAdopt();
boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewRelease();
/// The namespace with its commands.
boost::shared_ptr<Plinth::AutoCli::Namespace> NewNamespace();

}  // namespace linux

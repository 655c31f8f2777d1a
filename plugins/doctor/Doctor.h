/// The command `hcli doctor`.
#pragma once

#include <Plinth/AutoCli.h>

namespace TessaroCli::Doctor {

boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewDoctor();

}  // namespace TessaroCli::Doctor

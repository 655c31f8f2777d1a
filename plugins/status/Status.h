/// The command `hcli status`.
#pragma once

#include <Plinth/AutoCli.h>

namespace TessaroCli::Status {

boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewStatus();

}  // namespace TessaroCli::Status

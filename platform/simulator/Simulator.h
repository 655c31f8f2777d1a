/// What is done to a simulated host as a whole: neither traced nor answered. Each throws host::Error.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "host/Host.h"
#include "host/Pending.h"
#include "host/Platform.h"

#pragma GCC visibility push(default)

namespace simulator {

/// The platform of all simulated hosts, made when it is first asked for.
host::Platform& GetPlatform();

/// A host in memory. @p description is a host description, as all of them here.
std::unique_ptr<host::Host> HostOf(const std::string& description);

/// Makes @p host the one that @p description has.
void Load(const std::string& description, host::Host& host = host::Host::Current());
/// Its description; secrets are masked unless @p secrets.
std::string Show(bool secrets, host::Host& host = host::Host::Current());
std::vector<host::WaitingChange> ShowPending(host::Host& host = host::Host::Current());
void Reboot(host::Host& host = host::Host::Current());

}  // namespace simulator

#pragma GCC visibility pop

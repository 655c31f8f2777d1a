/// The file from which the software initiator's daemon has its name.
#pragma once

#include <optional>
#include <string>

#pragma GCC visibility push(default)

namespace host {

/// Where it lies. An Error where HCLI_ROOT is empty.
std::string InitiatorNameFile();

/// The name that the daemon is to use; nothing where none is configured. An Error where the file cannot be
/// read or makes no sense.
std::optional<std::string> ConfiguredInitiatorName();

}  // namespace host

#pragma GCC visibility pop

/// Making this machine's own initiator the host, and giving it back.
#pragma once

#pragma GCC visibility push(default)

namespace linux {

/// Makes the host the one that this machine is: one software adapter with the machine's initiator name.
/// Sessions that run stay as they are. An Error where a part of the machine is missing (see CheckMachine), or
/// where there is a host that somebody has changed and @p mayReplace is not said.
void Adopt(bool mayReplace);
/// Makes the host the one that a first run finds. Sessions run on, and come back as open-iscsi's records say.
/// An Error where the host is not this machine's.
void Release();

}  // namespace linux

#pragma GCC visibility pop

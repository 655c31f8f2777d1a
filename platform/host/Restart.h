/// Adapters and hosts that start again.
#pragma once

#include "host/Tree.h"

#pragma GCC visibility push(default)

namespace host {

/// Puts into effect what waits for a reset of the adapter. Its sessions end, and come back as far as the
/// network lets them in.
void Reset(Tree& tree, const Object& adapter);

/// Puts into effect all that waits, on every adapter, and the switch of the software initiator. All sessions
/// end, and come back on the adapters that are on the host then.
void Reboot(Tree& tree);

/// An adapter that is on the host again starts to work.
void Start(Tree& tree, const Object& adapter);

}  // namespace host

#pragma GCC visibility pop

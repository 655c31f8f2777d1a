/// Finding targets through the sendtargets of an adapter.
#pragma once

#include "host/Tree.h"

#pragma GCC visibility push(default)

namespace host {

/// Asks the sendtargets of @p adapter, brings what is known of targets up to what they tell, logs in where
/// there is no session yet and keeps the discovery status. What was set on a portal stays as long as the
/// portal is known. A portal that was found and is told of no more goes, and with its last portal the target;
/// those of a sendtarget that did not answer stay, and so do those of a target that has sessions. An Error
/// (WrongState) when the adapter is not online.
void Rediscover(Tree& tree, const Object& adapter);
}  // namespace host

#pragma GCC visibility pop

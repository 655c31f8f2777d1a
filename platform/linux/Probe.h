/// A look of one's own at a portal: open-iscsi cannot say which class and detail a target refuses a login
/// with.
#pragma once

#include <chrono>
#include <optional>
#include <string>

#include "host/Network.h"

#pragma GCC visibility push(default)

namespace linux {

using Milliseconds = std::chrono::milliseconds;

/// How a target takes the first PDU of a login.
struct FirstAnswer {
  host::Answer answer{host::kNoAnswer, {}};  // kDone where it would go on
  std::optional<int> portalGroupTag;         // of the portal, where it told
  bool chap = false;                         // it has chosen CHAP of what it was offered
};

/// Asks the portal for a session with @p target, or for a discovery session where that is empty, and waits
/// for at most @p limit. The connection is given up at once: no session comes of it, and no secret is sent.
/// To find the address of a name takes the resolver's own time besides.
FirstAnswer AskFirst(const host::Request& request, const std::string& target, Milliseconds limit);

}  // namespace linux

#pragma GCC visibility pop

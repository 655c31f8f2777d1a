/// Logging in to targets, and out. Logins are refused (Error) on an adapter that is not online.
#pragma once

#include <optional>

#include "host/Storage.h"
#include "host/Targets.h"

#pragma GCC visibility push(default)

namespace host {

/// Logs in to @p target by each way out by which it has no session, and where it has one by each, with one
/// session more; an Error when one fails. Its status word tells the outcome either way.
std::optional<Error> Login(Tree& tree, KnownTarget& target);
/// One session more, by the way out of @p session, which is one of the target's.
std::optional<Error> LoginLike(Tree& tree, KnownTarget& target, const Object& session);
/// Logs in to every target of the adapter by each way out by which it has no session yet; an Error when one
/// fails.
std::optional<Error> LoginAdapter(Tree& tree, const Object& adapter);

/// Ends one session, those with a target, or all. A target that only its sessions kept goes with them.
void LogoutSession(Tree& tree, const Object& session);
void Logout(Tree& tree, const KnownTarget& target);
void LogoutAdapter(Tree& tree, const Object& adapter);

}  // namespace host

#pragma GCC visibility pop

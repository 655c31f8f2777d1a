/// Changes that wait: for a reset of their adapter, or for the host to boot again.
///
/// The record of an object says what is in effect. What was set and is not in effect yet lies beside it under
/// the key "pending", as those parts of the record that will be different. What is configured is both: the
/// record with its pending parts in it. Setters judge and change what is configured, so that of several
/// changes in a row each sees the ones before it.
#pragma once

#include "host/PendingSchema.h"
#include "host/Status.h"
#include "host/Tree.h"

#pragma GCC visibility push(default)

namespace host {

/// When a change of @p setting takes effect on the adapter of that record.
Effect EffectOf(const Record& adapter, Setting setting);

/// The object with what waits in it in its record, and no key "pending".
Object Configured(const Object& object);

/// True where the part of the record at @p path is configured otherwise than it is in effect.
bool DoesWait(const Object& object, const std::string& path);

/// Stores what makes @p configured out of Configured(@p object): at once, or to wait for @p effect. An answer
/// of the description decides in place of @p effect where there is one. The status asks for what the object
/// waits for: for nothing once all its changes have been taken back.
Status StoreConfigured(Tree& tree, const Object& object, const Record& configured, Effect effect);

/// Puts into effect what waits in the adapter and in the places below it: for a reset, and where @p until is
/// Reboot for a reboot too.
void TakeEffect(Tree& tree, const Object& adapter, Effect until);

/// A setting that will be different.
struct WaitingChange {
  std::string adapter;  // empty for the host's own
  std::string place;    // the sendtarget or static target below the adapter; empty where it is none's
  std::string setting;  // by the keys of the description, such as "network/mtu"
  std::string from;     // what is in effect; empty where there is nothing
  std::string to;       // empty where there will be nothing
  Effect effect;        // what it waits for
};
/// All that waits, adapter by adapter.
std::vector<WaitingChange> WaitingChanges(Tree& tree);

}  // namespace host

#pragma GCC visibility pop

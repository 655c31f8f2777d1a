/// Targets as an adapter knows them: from objects of their own, which hold their sessions, and from the
/// target portals that lead to them.
#pragma once

#include "host/Tree.h"

#pragma GCC visibility push(default)

namespace host {

/// A target that is known from portals alone goes by the first of them. Its portal's id goes on to name it
/// once it has an object of its own.
struct KnownTarget {
  std::int64_t adapter = 0;
  Object object;                // its id is 0 where the target has no object of its own
  std::vector<Record> portals;  // those that lead to it
};

/// The target that @p id names; an Error (NotFound, WrongObject) where there is none.
KnownTarget GetTarget(Tree& tree, std::int64_t id);
/// The same without its portals.
KnownTarget GetTargetAlone(Tree& tree, std::int64_t id);
/// The id of the object of its own that this target has; 0 where it has none. Errors as of GetTarget.
std::int64_t OwnIdOf(Tree& tree, std::int64_t id);
/// Those of the adapter @p adapter: first those with an object of their own.
std::vector<std::int64_t> TargetIds(Tree& tree, std::int64_t adapter);

/// Where the target answers, as records of its list "addresses". A portal that is a host name has no place
/// there.
std::vector<Record> AddressesOf(const KnownTarget& target);

/// Whether the target portal of that record is a static target; one that was found may be one besides.
bool IsStatic(const Record& portal);
/// The name of the sendtarget through which the target portal was found; empty where it was not.
std::string OriginOf(const Record& portal);
/// The name of the sendtarget that the target portal inherits from. Empty for the adapter, as for each static
/// target: being found besides changes nothing of what holds for it.
std::string ParentOf(const Record& portal);

bool HasSession(Tree& tree, const Object& target);
/// Takes out @p target where no portal leads to it, it has neither a session nor an address of its own, and
/// nothing is said to have discovered it.
void ForgetTarget(Tree& tree, const Object& target);

/// Gives every target of the adapter @p adapter an object of its own. One alone would pass those in front of
/// it in the listings.
void SettleTargets(Tree& tree, std::int64_t adapter);
/// The target's own object, which it gets where it has none.
Object& OwnObject(Tree& tree, KnownTarget& target);

}  // namespace host

#pragma GCC visibility pop

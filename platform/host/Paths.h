/// The network portals of an adapter as paths: which sessions go over them.
///
/// A session says in its key "portal" over which bound NIC it goes; one that does not counts for each.
#pragma once

#include <vector>

#include "host/Tree.h"

#pragma GCC visibility push(default)

namespace host {

/// The sessions of the adapter that go over its network portal @p nic.
std::vector<Object> SessionsOver(Tree& tree, const Object& adapter, const std::string& nic);

/// The status of each of @p portals, all network portals of the adapter; numbers as iScsiNetworkPortalStatus.
/// A portal whose description tells one has that. Otherwise it is
/// - 3, last path: a target has sessions over this portal and over no other;
/// - 2, active: sessions go over it, and each of their targets has one over another portal too;
/// - 1, standby: none goes over it, while the adapter has sessions;
/// - 0, unused: the adapter has no session.
std::vector<int> PathStatuses(Tree& tree, const Object& adapter, const std::vector<Object>& portals);

/// True where the portal's description tells a path status with which sessions use it.
bool IsDescribedAsUsed(const Object& portal);

}  // namespace host

#pragma GCC visibility pop

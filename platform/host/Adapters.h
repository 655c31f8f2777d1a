/// Which adapters of the description are on the host.
#pragma once

#include <vector>

#include "host/Tree.h"

#pragma GCC visibility push(default)

namespace host {

/// True while the software initiator works; @p root is the host's own record.
bool DoesSoftwareWork(const Record& root);

bool IsIscsi(const Object& adapter);
/// A software adapter is on the host only while the software initiator works.
bool IsPresent(Tree& tree, const Object& adapter);

/// The iSCSI adapters that are on the host, in its order.
std::vector<Object> IscsiAdapters(Tree& tree);

/// The capability that the adapter lacks to be given a portal at @p host, which is an address or a name;
/// empty where it takes it.
std::string_view LackedFor(const Record& adapter, const std::string& host);

}  // namespace host

#pragma GCC visibility pop

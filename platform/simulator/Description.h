/// Host descriptions: a whole host as one JSON document.
///
/// A description with a fault is refused whole, as an Error (Invalid) that says where it is:
/// `adapters[1].capabilities.MTU Settable: expected true or false (line 40, column 25)`.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "host/Tree.h"
#include "store/Document.h"

#pragma GCC visibility push(default)

namespace simulator {

/// The objects in the order in which they begin: the host, and each behind its parent.
using Description = store::Document;

/// What @p text describes. What is no part of a host is refused where it begins, so that neither memory nor
/// depth is ever more than a host of this size takes.
Description ReadDescription(const std::string& text);

/// Replaces all that is in @p tree by what @p description has.
void LoadDescription(host::Tree& tree, const Description& description);

/// The description of @p tree, which LoadDescription reads into an equal one. Without @p secrets, they are
/// masked, and LoadDescription refuses it.
std::string ShowDescription(host::Tree& tree, bool secrets);

/// The description of the demo host, which a first run starts from.
std::string_view DemoDescription();

}  // namespace simulator

#pragma GCC visibility pop

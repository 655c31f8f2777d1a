/// Host descriptions: a whole host as one JSON document.
///
/// A description with a fault is refused whole, as an Error (Invalid) that says where it is:
/// `adapters[1].capabilities.MTU Settable: expected true or false (line 40, column 25)`.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include "host/Schema.h"
#include "host/Storage.h"

#pragma GCC visibility push(default)

namespace host {

class Tree;

/// What is shown in place of a secret; no secret is that.
inline constexpr std::string_view kMask = "***";

/// One object of a description, right by itself and in its place.
struct DescribedObject {
  Kind kind = Kind::Host;
  std::size_t parent = 0;  // its number in the description; the host's own is 0
  std::size_t place = 0;   // among the children of the parent that are of the same kind, from 0
  std::size_t offset = 0;  // in the text
  Record record;
};

/// The objects in the order in which they begin: the host, and each behind its parent.
using Description = std::vector<DescribedObject>;

/// What @p text describes. What is no part of a host is refused where it begins, so that neither memory nor
/// depth is ever more than a host of this size takes.
Description ReadDescription(const std::string& text);

/// Replaces all that is in @p tree by what @p description has.
void LoadDescription(Tree& tree, Description description);

/// The description of @p tree, which LoadDescription reads into an equal one. Without @p secrets, they are
/// masked, and LoadDescription refuses it.
std::string ShowDescription(Tree& tree, bool secrets);

/// The record of an object of @p kind with all of @p given and the defaults of what is not in it, checked.
Record Complete(Kind kind, const Record& given);

/// The description of the demo host, which a first run starts from.
std::string_view DemoDescription();

}  // namespace host

#pragma GCC visibility pop

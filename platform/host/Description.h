/// Host descriptions: a whole host as one JSON document.
///
/// A description with a fault is refused whole, as an Error (Refused) whose text begins with the path of the
/// fault: `adapters[1].capabilities.MTU Settable: expected true or false`.
#pragma once

#include <string>
#include <string_view>

#include "host/Schema.h"

#pragma GCC visibility push(default)

namespace host {

class Record;
class Tree;

/// What is shown in place of a secret; no secret is that.
inline constexpr std::string_view kMask = "***";

/// Replaces all that is in @p tree by what @p text describes.
void LoadDescription(Tree& tree, const std::string& text);

/// The description of @p tree, which LoadDescription reads into an equal one. Without @p secrets, they are
/// masked, and LoadDescription refuses it.
std::string ShowDescription(Tree& tree, bool secrets);

/// The record of an object of @p kind with all of @p given and the defaults of what is not in it, checked.
Record Complete(Kind kind, const Record& given);

/// The description of the demo host, which a first run starts from.
std::string_view DemoDescription();

}  // namespace host

#pragma GCC visibility pop

/// What holds at a place of an adapter that takes from its parents what is not set on it.
#pragma once

#include <vector>

#include "host/Network.h"
#include "host/Tree.h"

#pragma GCC visibility push(default)

namespace host {

/// The records of a place and of what it inherits from, next first; the adapter's is the last.
using Inheritance = std::vector<const Record*>;

/// Where the record of a place has @p key of @p group.
std::string PathOf(std::string_view group, std::string_view key);
/// The value at @p path; a truth value is 0 or 1.
std::int64_t ValueAt(const Record& record, const std::string& path, Type type);

/// The value that holds of kParameters[@p index]; a truth value is 0 or 1. Tells the depth from which it
/// comes where @p depth is given: 0 is the place itself.
std::int64_t ParameterAt(const Inheritance& levels, std::size_t index, std::size_t* depth = nullptr);
/// The demand that holds of kDigests[@p index].
Demand DigestAt(const Inheritance& levels, std::size_t index);
/// The CHAP entry that holds of the direction kDirections[@p index].
ChapEntry ChapAt(const Inheritance& levels, std::size_t index);

}  // namespace host

#pragma GCC visibility pop

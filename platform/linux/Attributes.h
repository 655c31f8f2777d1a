/// The small files in which the kernel tells of itself.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#pragma GCC visibility push(default)

namespace linux {

/// The text of a file of the host, without the newline at its end. Empty where there is none, where the
/// kernel refuses to tell, and where it says "(null)", its word for nothing.
std::string Attribute(const std::string& path);
/// The same as a decimal number; 0 where there is none.
std::int64_t NumberAttribute(const std::string& path);
/// The names in a folder of the host that begin with @p prefix, sorted; none where there is no such folder.
std::vector<std::string> Names(const std::string& folder, std::string_view prefix = {});
/// Where a link of the host leads, without following links on the way; empty where it is none.
std::string LinkAt(const std::string& path);

}  // namespace linux

#pragma GCC visibility pop

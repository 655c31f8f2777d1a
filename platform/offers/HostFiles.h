/// What a host has on the disk, as doctor looks at it: nothing is made, mended or converted.
#pragma once

#include <Plinth/Checks.h>

#include <string>
#include <vector>

namespace offers {

using Findings = std::vector<Plinth::Finding>;

/// The folder of the database @p path: whether it can be written to, and what room there is.
void CheckFolder(const std::string& path, Findings& findings);

/// The file @p path by itself: who may do what with it, and who keeps it locked. False where it cannot be
/// looked into.
bool CheckFile(const std::string& path, Findings& findings);

}  // namespace offers

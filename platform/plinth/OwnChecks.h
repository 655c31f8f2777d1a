/// What the framework looks at by itself, by file.
#pragma once

#include <Plinth/AutoCli.h>
#include <Plinth/Checks.h>

#include <vector>

namespace Plinth {

/// Loads each plug-in that the process can use, in a process of its own first, and hangs what it registers
/// under @p root. The libraries of those that work are loaded behind that.
void CheckPlugins(AutoCli::Namespace& root, std::vector<Finding>& findings);

/// The guide files.
void CheckGuides(std::vector<Finding>& findings);

/// Standard output as people see it: the terminal, its characters, colours and pager.
void CheckTerminal(std::vector<Finding>& findings);

}  // namespace Plinth

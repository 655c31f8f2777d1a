/// Files of the source tree that tests read.
#pragma once

#include <string>

/// The path of @p name, given from the top of the source tree.
std::string ProjectFile(const std::string& name);
/// What stands in it; empty where it is not there.
std::string FileText(const std::string& name);

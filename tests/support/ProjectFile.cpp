#include "support/ProjectFile.h"

std::string ProjectFile(const std::string& name) { return std::string(HCLI_SOURCE_DIR) + '/' + name; }

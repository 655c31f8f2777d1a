#include "support/ProjectFile.h"

#include <fstream>
#include <iterator>

std::string ProjectFile(const std::string& name) { return std::string(HCLI_SOURCE_DIR) + '/' + name; }

std::string FileText(const std::string& name) {
  std::ifstream file(ProjectFile(name));
  return {std::istreambuf_iterator<char>(file), {}};
}

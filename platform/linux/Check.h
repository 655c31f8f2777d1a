/// What this machine needs to be an initiator that hcli manages, and what of it is there.
#pragma once

#include <string>
#include <vector>

namespace linux {

struct Finding {
  std::string part;  // such as "daemon"
  bool isThere = false;
  std::string found;  // a few words
  std::string mend;   // what to do; empty where it is there
};

/// All parts, in the order in which they are mended.
std::vector<Finding> CheckMachine();

}  // namespace linux

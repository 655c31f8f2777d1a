/// What this machine needs to be an initiator that hcli manages, and what of it is there.
#pragma once

#include <string>
#include <vector>

#pragma GCC visibility push(default)

namespace linux {

struct Finding {
  std::string part;  // such as "daemon"
  bool isThere = false;
  std::string found;  // a few words
  std::string mend;   // what to do; empty where it is there
};

/// The part whose finding is the machine's initiator name.
inline constexpr const char* kNamePart = "initiator name";

/// All parts, in the order in which they are mended. Ends a group of changes: see Host::Settle.
std::vector<Finding> CheckMachine();

}  // namespace linux

#pragma GCC visibility pop

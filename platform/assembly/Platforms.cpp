/// What hosts stand on: this machine where it was adopted, and else what is imagined.
#include "linux/Platform.h"
#include "simulator/Simulator.h"

namespace assembly {

namespace {

linux::Platform platform(simulator::GetPlatform());

}  // namespace

}  // namespace assembly

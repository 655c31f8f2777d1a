/// The network that the description of the host tells of.
#pragma once

#include <memory>

#include "host/Network.h"
#include "host/Tree.h"

namespace simulator {

std::unique_ptr<host::Network> MakeNetwork(host::Tree& tree);

}  // namespace simulator

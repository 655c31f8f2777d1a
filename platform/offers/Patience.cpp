#include <Plinth/Patience.h>

#include "host/Host.h"

namespace offers {

namespace {

class HostPatience final : public Plinth::Patience {
 public:
  HostPatience() { Plinth::AddPatience(*this); }
  std::chrono::milliseconds SetLimit(std::chrono::milliseconds limit) noexcept override {
    return std::chrono::milliseconds(host::Host::SetPatience(static_cast<int>(limit.count())));
  }
};

HostPatience patience;

}  // namespace

}  // namespace offers

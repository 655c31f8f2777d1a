#include <Plinth/Rehearsal.h>

#include "host/Host.h"

namespace offers {

namespace {

class HostRehearsal final : public Plinth::Rehearsal {
 public:
  HostRehearsal() { Plinth::AddRehearsal(*this); }
  void Begin() override { host::Host::BeginRehearsal(); }
  std::vector<std::string> TakeCalls() override { return host::Host::TakeRehearsedCalls(); }
  void End() noexcept override { host::Host::EndRehearsal(); }
};

HostRehearsal rehearsal;

}  // namespace

}  // namespace offers

#include <Plinth/ChangeGroup.h>

#include "host/Host.h"

namespace offers {

namespace {

class HostChangeGroup final : public Plinth::ChangeGroup {
 public:
  HostChangeGroup() { Plinth::AddChangeGroup(*this); }
  void Begin() override { host::Host::BeginGroup(); }
  bool IsOpen() const noexcept override { return host::Host::IsGroupOpen(); }
  bool Commit() noexcept override { return host::Host::CommitGroup(); }
};

HostChangeGroup changeGroup;

}  // namespace

}  // namespace offers

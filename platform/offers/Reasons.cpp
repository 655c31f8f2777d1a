#include <Plinth/Reasons.h>

#include "host/CallLog.h"

namespace offers {

namespace {

class HostReasons final : public Plinth::ReasonSource {
 public:
  HostReasons() { Plinth::SetReasonSource(this); }

  void BeginRun() override { host::CallLog::Current().Begin(); }

  std::optional<Plinth::Reason> TakeFailure() override {
    std::optional<host::FailedCall> failed = host::CallLog::Current().TakeFailure();
    if (!failed) return {};
    return Plinth::Reason{std::move(failed->operation), std::move(failed->adapter), std::string(failed->code),
                          std::move(failed->text)};
  }

  std::vector<std::string> TakeNotes() override { return host::CallLog::Current().TakeNotes(); }
};

HostReasons reasons;

}  // namespace

}  // namespace offers

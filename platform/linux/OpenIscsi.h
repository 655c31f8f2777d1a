/// The network as this machine reaches it by open-iscsi: its program, its daemon and its records.
#pragma once

#include <string>
#include <vector>

#include "linux/Parameters.h"
#include "linux/Probe.h"

#pragma GCC visibility push(default)

namespace linux {

inline constexpr const char* kIscsiadm = "/sbin/iscsiadm";

/// Each operation waits for targets: no transaction may be open. What is wrong with this machine, such as a
/// daemon that does not run, is an Error.
class OpenIscsi final : public host::Network {
 public:
  /// @p limit is how long each operation may take.
  explicit OpenIscsi(Milliseconds limit) : limit_(limit) {}

  bool DoesWait() const override { return true; }
  bool FindsWays() const override { return true; }
  host::SendTargetsAnswer SendTargets(const host::Request& request) override;
  /// The session comes back when the machine has been started anew. The kernel tells no TSIH: the number of
  /// its session stands for it. The ISID is open-iscsi's own, too. Where open-iscsi has such a session
  /// already, the status is kSessionExists.
  host::LoginAnswer Login(const host::LoginRequest& request) override;
  /// Ends the kernel's session with the id @p request.session, which then does not come back; where it is
  /// another target's by now, nothing happens. An Error where the session stays, and where others began it.
  void Logout(const host::LogoutRequest& request) override;

 private:
  Milliseconds limit_;
};

}  // namespace linux

#pragma GCC visibility pop

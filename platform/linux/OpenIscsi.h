/// The network as this machine reaches it by open-iscsi: its program, its daemon and its records.
#pragma once

#include <string>
#include <vector>

#include "linux/Parameters.h"
#include "linux/Probe.h"

namespace linux {

inline constexpr const char* kIscsiadm = "/sbin/iscsiadm";

/// Whose interface record open-iscsi is to use, and how long it may take.
struct Way {
  std::string interface;               // the name of the record, such as "hcli.hba0" or "hcli.hba0.eth1"
  std::string device;                  // the network device that it is bound to; empty for any
  std::vector<ParameterValue> timing;  // parameters that no login talks about, such as LoginTimeout
  Milliseconds limit{20000};           // for each operation
};

/// Each operation waits for targets: no transaction may be open. What is wrong with this machine, such as a
/// daemon that does not run, is an Error.
class OpenIscsi final : public host::Network {
 public:
  explicit OpenIscsi(Way way) : way_(std::move(way)) {}

  bool DoesWait() const override { return true; }
  host::SendTargetsAnswer SendTargets(const host::Request& request) override;
  /// The session comes back when the machine has been started anew. The kernel tells no TSIH: the number of
  /// its session stands for it. The ISID is open-iscsi's own, too. Where open-iscsi has such a session
  /// already, an Error.
  host::LoginAnswer Login(const host::LoginRequest& request) override;
  /// Ends the kernel's session with the number @p request.tsih, which then does not come back; where that is
  /// another target's by now, nothing happens. An Error where the session stays.
  void Logout(const host::LogoutRequest& request) override;

 private:
  void WriteInterface(const host::Request& request) const;

  Way way_;
};

}  // namespace linux

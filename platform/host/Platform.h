/// What a host stands on: an imagined network, or the one that this computer is in. The host knows its
/// platform by this interface alone.
#pragma once

#include <memory>
#include <string>

#include "host/Machine.h"
#include "host/Network.h"
#include "host/Tree.h"

#pragma GCC visibility push(default)

namespace host {

/// Is there for as long as it lives: that made last is the one of all hosts.
class Platform {
 public:
  Platform();
  Platform(const Platform&) = delete;
  Platform& operator=(const Platform&) = delete;
  virtual ~Platform();

  static Platform& Current();

  /// The network that the adapters of @p tree see, for the length of one operation.
  virtual std::unique_ptr<Network> NetworkOf(Tree& tree) = 0;
  /// The machine that tells what is; null where that stands in the store too, as with an imagined one. It
  /// asks @p tree for nothing that it tells of itself.
  virtual std::unique_ptr<Machine> MachineOf(Tree&) { return nullptr; }
  /// The host that is there before anybody has made one: a store in memory.
  virtual std::unique_ptr<Store> NewStore() = 0;
  /// The command line that shows what waits for a reset or a reboot; empty where there is none.
  virtual std::string WaitingCommand() const { return ""; }

 private:
  Platform* before_;
};

}  // namespace host

#pragma GCC visibility pop

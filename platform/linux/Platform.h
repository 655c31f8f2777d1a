/// What an adopted host stands on.
#pragma once

#include "host/Platform.h"

#pragma GCC visibility push(default)

namespace linux {

/// The key of the host's own record that says whose machine it is, and what it says of an adopted one.
inline constexpr const char* kMachineKey = "machine";
inline constexpr const char* kAdopted = "linux";

/// True where the host is this machine's own.
bool IsAdopted(store::Tree& tree);

/// This machine for a host that adopted it, and the platform that was there before for any other.
class Platform final : public host::Platform {
 public:
  explicit Platform(host::Platform& before) : before_(before) {}

  std::unique_ptr<host::Network> NetworkOf(host::Tree& tree) override;
  std::unique_ptr<host::Machine> MachineOf(host::Tree& tree) override;
  std::unique_ptr<host::Store> NewStore() override { return before_.NewStore(); }

 private:
  /// The same as linux::IsAdopted, which most hosts would be asked once an operation.
  bool IsAdopted(store::Tree& tree);

  host::Platform& before_;
  // What was found last, and where.
  const store::Store* store_ = nullptr;
  std::uint64_t state_ = 0;
  bool isAdopted_ = false;
};

}  // namespace linux

#pragma GCC visibility pop

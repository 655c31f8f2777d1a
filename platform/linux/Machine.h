/// This machine behind a host: its network interfaces, and what its kernel has of sessions.
#pragma once

#include <string>
#include <vector>

#include "host/Machine.h"
#include "linux/Sessions.h"

#pragma GCC visibility push(default)

namespace linux {

/// The name of the interface record by which an adapter goes out by a network interface, or by any where that
/// is empty.
std::string InterfaceName(const std::string& adapter, const std::string& nic);
/// True where the record is one of ours, of any adapter.
bool IsOurs(const std::string& interface);

/// The kernel's number of the session, from its object's id and back.
std::int64_t IdOfSession(int number);
int NumberOfSession(std::int64_t id);

/// Looks once, when it is first asked. Sessions that others began belong to the first adapter.
class Machine final : public host::Machine {
 public:
  /// Of @p tree it asks for adapters and targets of the store alone.
  explicit Machine(store::Tree& tree) : tree_(tree) {}

  std::vector<store::Object> Children(std::int64_t parent, store::Kind kind) override;
  std::optional<store::Object> Lookup(std::int64_t id) override;

 private:
  void Look();
  void AddNics();
  void AddSession(const store::Object& adapter, const Session& session);
  std::int64_t TargetOf(const store::Object& adapter, const Session& session);

  store::Tree& tree_;
  bool hasLooked_ = false;
  std::vector<store::Object> objects_;
};

}  // namespace linux

#pragma GCC visibility pop

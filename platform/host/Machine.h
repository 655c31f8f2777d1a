/// What is, where a machine tells of it each time that it is asked: sessions and connections, network
/// interfaces, boot tables. What an administrator wants stands in the store in any case.
#pragma once

#include <cstdint>
#include <optional>
#include <vector>

#include "host/Schema.h"
#include "store/Tree.h"

#pragma GCC visibility push(default)

namespace host {

/// The ids of a machine's objects begin here; those of the store are below. An id that a command was given
/// holds in later calls of its process, as long as the object is there.
inline constexpr std::int64_t kFirstMachineId = std::int64_t{1} << 48;

/// Tells its objects as the store would: the record has all keys that the schema has for the kind (see
/// store::Complete), the name is NameOf. Which there are stays the same for the length of one operation.
class Machine {
 public:
  Machine() = default;
  Machine(const Machine&) = delete;
  Machine& operator=(const Machine&) = delete;
  virtual ~Machine() = default;

  /// The objects of @p kind below the object @p parent, in the order of listings:
  /// - Kind::Nic and Kind::BootTable below kRoot;
  /// - Kind::Session below a target, of the store or of the machine;
  /// - Kind::Connection below a session;
  /// - Kind::Target below an adapter: those alone that the store does not know, as others began sessions with
  /// them.
  virtual std::vector<Object> Children(std::int64_t parent, Kind kind) = 0;
  /// The one with the id @p id, if it is there.
  virtual std::optional<Object> Lookup(std::int64_t id) = 0;
};

}  // namespace host

#pragma GCC visibility pop

/// How long library calls wait for other processes: how a platform lets the user say.
#pragma once

#include <chrono>

#pragma GCC visibility push(default)

namespace Plinth {

/// Implemented by a platform whose calls may have to wait for another process, such as one that keeps a file
/// locked.
class Patience {
 public:
  Patience() = default;
  Patience(const Patience&) = delete;
  Patience& operator=(const Patience&) = delete;
  virtual ~Patience() = default;

  /// From now on, a call that has waited for @p limit (0 or more) gives up and fails; 0 is not to wait at
  /// all. Returns the limit that held before. Opens nothing, and throws nothing.
  virtual std::chrono::milliseconds SetLimit(std::chrono::milliseconds limit) noexcept = 0;
};

/// The framework asks @p patience too from now on. The caller keeps it to the end of the process.
void AddPatience(Patience& patience);

}  // namespace Plinth

#pragma GCC visibility pop

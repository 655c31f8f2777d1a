/// Dry runs: how a platform lets a command run without lasting effect.
#pragma once

#include <string>
#include <vector>

#pragma GCC visibility push(default)

namespace Plinth {

/// Implemented by a platform. A rehearsal is begun ahead of one or more commands and ended behind them, on
/// the thread that runs commands. In between, library calls give what they would give otherwise, and see what
/// earlier ones have changed; but nothing that they do is seen outside of the process, and all of it is
/// undone at the end. What a platform has no way to undo, its calls must not do then.
class Rehearsal {
 public:
  Rehearsal() = default;
  Rehearsal(const Rehearsal&) = delete;
  Rehearsal& operator=(const Rehearsal&) = delete;
  virtual ~Rehearsal() = default;

  /// Opens nothing. Throws nothing but std::bad_alloc, and has not begun then.
  virtual void Begin() = 0;
  /// The calls that have changed something since the beginning, or since this was asked: one line of text
  /// each, UTF-8, with *** for secrets. Throws nothing but std::bad_alloc.
  virtual std::vector<std::string> TakeCalls() = 0;
  /// Undoes everything. Others may have been kept waiting until now: the framework writes nothing out, and
  /// asks for no input, before.
  virtual void End() noexcept = 0;
};

/// The framework begins @p rehearsal too from now on. The caller keeps it to the end of the process. Where no
/// platform has one, dry runs are refused.
void AddRehearsal(Rehearsal& rehearsal);

/// A dry run is under way: a command that does something by itself, rather than by library calls, leaves it
/// out then.
bool IsRehearsing();

}  // namespace Plinth

#pragma GCC visibility pop

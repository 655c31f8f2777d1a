/// Changes of several commands that are made durable together: how a platform lets a batch be fast.
#pragma once

#pragma GCC visibility push(default)

namespace Plinth {

/// Implemented by a platform whose library calls make durable what they change, at a price that can be paid
/// once for many. Used on the thread that runs commands, and only with commands of which nobody has seen an
/// answer yet: those whose changes could not be kept are run again.
class ChangeGroup {
 public:
  ChangeGroup() = default;
  ChangeGroup(const ChangeGroup&) = delete;
  ChangeGroup& operator=(const ChangeGroup&) = delete;
  virtual ~ChangeGroup() = default;

  /// From now on, calls may leave what they change to be made durable by Commit. Later calls see it. Others
  /// may be kept waiting from the first change on: the framework commits within some tenths of a second, and
  /// neither writes anything out nor asks for input before. A call that has to wait itself, or does what
  /// cannot be undone, commits ahead of that, and the group is not open any more; a command that does so
  /// outside of the platform's calls asks for it with SettleChanges. Opens nothing. Throws
  /// nothing but std::bad_alloc, and has not begun then.
  virtual void Begin() = 0;
  /// False once a call has committed the group, or has lost what was changed. What is changed from then on is
  /// durable when the call returns, or lost with the rest.
  virtual bool IsOpen() const noexcept = 0;
  /// Ends the group. True where all that was changed since Begin is durable, false where it could not be made
  /// so: nothing of it has happened then.
  virtual bool Commit() noexcept = 0;
};

/// The framework uses @p group from now on. The caller keeps it to the end of the process. Where several are
/// named, no commit would hold for all of them: then none is used, and each command's changes are made
/// durable by themselves. So a plug-in that changes something by itself, rather than through a platform's
/// libraries, names one too, which need not do anything.
void AddChangeGroup(ChangeGroup& group);

/// For a command that takes its time, writes files of its own or looks at how those of the platform stand:
/// makes durable what has been left so far, and ends the group. What is changed from then on is durable when
/// the call returns. Does nothing where no group is open. Throws std::runtime_error where nothing of it could
/// be kept; the command, which is to leave then, is run again.
void SettleChanges();

}  // namespace Plinth

#pragma GCC visibility pop

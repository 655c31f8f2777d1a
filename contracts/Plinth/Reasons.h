/// Why library calls failed in a run, and what they did besides: how a platform tells the framework.
///
/// Commands report failures in texts of their own. What the libraries behind them know of a failure is shown
/// behind those texts where a plug-in has named a source of reasons; without one, nothing is shown, and
/// nothing is lost.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#pragma GCC visibility push(default)

namespace Plinth {

/// What a failure is, for scripts: a word, and the exit status of a run that --exit-codes is given to. Words
/// and numbers stay as they are; new ones come behind.
struct ReasonCode {
  std::string_view name;
  int exitStatus;
};

inline constexpr ReasonCode kReasonCodes[] = {
    {"failed", 10},         // none of the others
    {"not-found", 11},      // what is named is not there
    {"exists", 12},         // what is to be added is there already
    {"invalid", 13},        // a value that is none of its kind
    {"out-of-range", 14},   // a number or a length that is too small or too large
    {"not-settable", 15},   // a setting that cannot be changed there
    {"not-supported", 16},  // there is no such thing there
    {"wrong-state", 17},    // something else stands against it, and can be changed
    {"in-use", 18},         // something uses what is to go
    {"too-many", 19},       // there is no room for one more
    {"busy", 20},           // another process keeps it locked
    {"denied", 21},         // the system does not let the caller at it
    {"damaged", 22},        // what is stored makes no sense
    {"no-space", 23},       // the disk, or a quota, is full
    {"no-memory", 24},      // memory ran out
    {"login-refused", 25},  // the other side, or one's own, ended a login
    {"no-answer", 26},      // nobody answered, or no way leads there
};

/// A library call that failed.
struct Reason {
  std::string operation;  ///< the name of the call; empty where it was none, but a value that is none
  std::string adapter;    ///< what the call was on, by name; empty where there is none
  std::string code;       ///< one of kReasonCodes
  std::string text;  ///< whole sentences, UTF-8 without a line break at the end, and no secret; never empty
};

/// Implemented by a platform. Called from the thread that runs commands, and never while a library call is
/// under way. Throws nothing but std::bad_alloc.
class ReasonSource {
 public:
  ReasonSource() = default;
  ReasonSource(const ReasonSource&) = delete;
  ReasonSource& operator=(const ReasonSource&) = delete;
  virtual ~ReasonSource() = default;

  /// A command begins to run: what was before is of no more concern.
  virtual void BeginRun() = 0;
  /// The call that failed last since the run began or this was asked, if there is one. The framework asks
  /// when a command reports something: it shows what failed last as the reason, and takes it that the
  /// command got over what had failed before.
  virtual std::optional<Reason> TakeFailure() = 0;
  /// What the calls of the run have done or left to do that their results do not show, such as that an
  /// adapter was reset: a sentence each.
  virtual std::vector<std::string> TakeNotes() = 0;
};

/// The framework asks @p source from now on, in place of the one named before, which is returned; null is
/// none. The caller keeps it to the end of the process, or names another.
ReasonSource* SetReasonSource(ReasonSource* source);

}  // namespace Plinth

#pragma GCC visibility pop

/// What a run's library calls leave to tell besides their results: why one failed, and what is not done yet.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "host/Call.h"
#include "host/PendingSchema.h"
#include "host/Status.h"
#include "host/Storage.h"

#pragma GCC visibility push(default)

namespace host {

struct FailedCall {
  std::string operation;  // empty where it was no call
  std::string adapter;    // empty where there is none
  std::string_view code;
  std::string text;
};

/// Kept for the process. Where memory runs out, it keeps less; nothing here throws but what takes out.
class CallLog {
 public:
  static CallLog& Current();

  /// Forgets all.
  void Begin() noexcept;

  void Failed(const Call& call, const std::string& adapter, const Error& error) noexcept;
  /// What the platform did by itself failed.
  void Failed(const Error& error) noexcept;
  /// A value was refused, outside any call or in the middle of one that is then told as failed itself.
  void Refused(const std::string& text) noexcept;
  /// A call that succeeded gave this.
  void Gave(const Call& call) noexcept;
  void Gave(const Call& call, Status status) noexcept;
  void GaveNothing(const Call& call) noexcept;
  void WasReset(const std::string& adapter) noexcept;
  /// A change of @p what waits.
  void Waits(const std::string& what, Effect effect) noexcept;

  /// The last failure that was not taken yet.
  std::optional<FailedCall> TakeFailure();
  /// A sentence for each reset, and for each change that waits for one or for a reboot.
  std::vector<std::string> TakeNotes();

 private:
  struct Note {
    std::string what;
    Effect waitsFor;  // Now for what was reset
    bool operator==(const Note&) const = default;
  };

  template <class Make>
  void Keep(Make make, bool isResult) noexcept;
  void Add(const std::string& what, Effect effect) noexcept;

  std::optional<FailedCall> failure_;
  bool isResult_ = false;  // the failure shows in a result alone, which the next call makes forgotten
  std::vector<Note> notes_;
};

}  // namespace host

#pragma GCC visibility pop

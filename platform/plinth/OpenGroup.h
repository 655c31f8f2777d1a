/// Commands whose changes are made durable together.
#pragma once

#include <Plinth/ChangeGroup.h>

namespace Plinth {

/// The platform's change group, begun; it is committed at the end at the latest.
class OpenGroup {
 public:
  OpenGroup();
  OpenGroup(const OpenGroup&) = delete;
  OpenGroup& operator=(const OpenGroup&) = delete;
  ~OpenGroup();

  /// Whether there is one to begin.
  static bool IsOffered();

  bool IsOpen() const { return group_ && group_->IsOpen(); }
  /// Does nothing where it is committed already. False where nothing of what was changed has happened.
  bool Commit();

 private:
  ChangeGroup* group_;  // null once it is committed
  bool isKept_ = true;
};

}  // namespace Plinth

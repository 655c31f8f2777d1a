/// The objects of a host, as one operation sees and changes them.
#pragma once

#include <optional>

#include "host/Schema.h"
#include "host/Status.h"
#include "store/Tree.h"

namespace host {

class Tree : public store::Tree {
 public:
  using store::Tree::Tree;

  /// The status that the description has the operation answer, where it does.
  const std::optional<Status>& Answer() const { return answer_; }
  void SetAnswer(std::optional<Status> status) { answer_ = status; }

 private:
  std::optional<Status> answer_;
};

}  // namespace host

#include "plinth/OpenGroup.h"

#include <stdexcept>
#include <utility>
#include <vector>

namespace Plinth {

namespace {

std::vector<ChangeGroup*>& ChangeGroups() {
  static std::vector<ChangeGroup*> groups;
  return groups;
}

OpenGroup* current = nullptr;

}  // namespace

void AddChangeGroup(ChangeGroup& group) { ChangeGroups().push_back(&group); }

void SettleChanges() {
  if (!current || current->Commit()) return;
  throw std::runtime_error("what was changed ahead of this could not be kept");
}

bool OpenGroup::IsOffered() { return ChangeGroups().size() == 1; }

OpenGroup::OpenGroup() : group_(ChangeGroups().front()) {
  group_->Begin();
  current = this;
}

OpenGroup::~OpenGroup() {
  Commit();
  current = nullptr;
}

bool OpenGroup::Commit() {
  if (ChangeGroup* const group = std::exchange(group_, nullptr)) isKept_ = group->Commit();
  return isKept_;
}

}  // namespace Plinth

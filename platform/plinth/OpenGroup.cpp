#include "plinth/OpenGroup.h"

#include <utility>
#include <vector>

namespace Plinth {

namespace {

std::vector<ChangeGroup*>& ChangeGroups() {
  static std::vector<ChangeGroup*> groups;
  return groups;
}

}  // namespace

void AddChangeGroup(ChangeGroup& group) { ChangeGroups().push_back(&group); }

bool OpenGroup::IsOffered() { return ChangeGroups().size() == 1; }

OpenGroup::OpenGroup() : group_(ChangeGroups().front()) { group_->Begin(); }

bool OpenGroup::Commit() {
  ChangeGroup* const group = std::exchange(group_, nullptr);
  return !group || group->Commit();
}

}  // namespace Plinth

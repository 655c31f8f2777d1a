#include "level/Level.h"

#include "OwnedVector.h"

namespace TessaroCli::IscsiNamespace {

std::vector<StaticTarget> TargetsNamed(iScsiInterface& adapter, const std::string& name,
                                       const std::string& address) {
  if (name != "all" || address != "all") return {{name, IscsiTools::GetTargetAddressFromString(address)}};
  std::vector<StaticTarget> targets;
  const OwnedVector<StaticTarget> all(adapter.GetStaticTargets());
  for (const StaticTarget* target : all) targets.push_back(*target);
  return targets;
}

}  // namespace TessaroCli::IscsiNamespace

#include "host/Restart.h"

#include "host/Adapters.h"
#include "host/Discovery.h"
#include "host/Pending.h"
#include "host/Sessions.h"

namespace host {

void Reset(Tree& tree, const Object& adapter) {
  LogoutAdapter(tree, adapter);
  TakeEffect(tree, adapter, Effect::Reset);
  Start(tree, tree.Get(adapter.id, Kind::Adapter));
}

void Reboot(Tree& tree) {
  Object root = tree.Get(kRoot, Kind::Host);
  root.record.Set("softwareIscsi/rebootPending", false);
  tree.Update(root);
  for (const Object& adapter : tree.Children(kRoot, Kind::Adapter)) {
    LogoutAdapter(tree, adapter);
    TakeEffect(tree, adapter, Effect::Reboot);
  }
  for (const Object& adapter : IscsiAdapters(tree)) Start(tree, adapter);
}

void Start(Tree& tree, const Object& adapter) {
  if (adapter.record.GetInt("state") == 0) Rediscover(tree, adapter);
}

}  // namespace host

#include "linux/Platform.h"

#include "host/Schema.h"
#include "linux/Machine.h"
#include "linux/OpenIscsi.h"

namespace linux {

bool IsAdopted(store::Tree& tree) {
  const auto host = tree.store::Tree::Lookup(store::kRoot);
  return host && host->record.Has(kMachineKey) && host->record.GetString(kMachineKey) == kAdopted;
}

bool Platform::IsAdopted(store::Tree& tree) {
  const store::Store& store = tree.GetStore();
  if (store_ == &store && state_ == store.GetState()) return isAdopted_;
  isAdopted_ = linux::IsAdopted(tree);
  store_ = &store;
  state_ = store.GetState();
  return isAdopted_;
}

std::unique_ptr<host::Network> Platform::NetworkOf(host::Tree& tree) {
  if (!IsAdopted(tree)) return before_.NetworkOf(tree);
  return std::make_unique<OpenIscsi>(Milliseconds(host::Patience()));
}

std::unique_ptr<host::Machine> Platform::MachineOf(host::Tree& tree) {
  if (!IsAdopted(tree)) return before_.MachineOf(tree);
  return std::make_unique<Machine>(tree);
}

}  // namespace linux

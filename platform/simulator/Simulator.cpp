#include "simulator/Simulator.h"

#include "host/Platform.h"
#include "host/Restart.h"
#include "simulator/Description.h"
#include "simulator/SimulatedNetwork.h"
#include "store/Tables.h"

namespace simulator {

namespace {

std::unique_ptr<host::Store> DescribedStore(const std::string& text) {
  const Description description = ReadDescription(text);
  auto store = std::make_unique<host::Store>();
  host::Transaction transaction(*store, host::Transaction::Access::Change);
  store::CreateTables(*store);
  host::Tree tree(*store);
  LoadDescription(tree, description);
  transaction.Commit();
  return store;
}

class Simulator final : public host::Platform {
 public:
  std::unique_ptr<host::Network> NetworkOf(host::Tree& tree) override { return MakeNetwork(tree); }
  std::unique_ptr<host::Store> NewStore() override { return DescribedStore(std::string(DemoDescription())); }
  std::string WaitingCommand() const override { return "hcli simulator pending"; }
};

}  // namespace

host::Platform& GetPlatform() {
  static Simulator simulator;
  return simulator;
}

std::unique_ptr<host::Host> HostOf(const std::string& description) {
  return host::Host::InMemory(DescribedStore(description));
}

void Load(const std::string& text, host::Host& host) {
  // Nobody has to wait while a large one is read.
  const Description description = ReadDescription(text);
  // A page written before its time would lock out readers for the whole of a long load.
  host.GetStore().Execute("PRAGMA cache_spill=off");
  host.Administer(
      "Load(...)", host::Transaction::Access::Change,
      [&](host::Tree& tree) { LoadDescription(tree, description); }, &host::Store::CheckPages);
}

std::string Show(bool secrets, host::Host& host) {
  std::string text;
  host.Administer("Show()", host::Transaction::Access::Read,
                  [&](host::Tree& tree) { text = ShowDescription(tree, secrets); });
  return text;
}

std::vector<host::WaitingChange> ShowPending(host::Host& host) {
  std::vector<host::WaitingChange> changes;
  host.Administer("ShowPending()", host::Transaction::Access::Read,
                  [&](host::Tree& tree) { changes = host::WaitingChanges(tree); });
  return changes;
}

void Reboot(host::Host& host) {
  host.Administer("Reboot()", host::Transaction::Access::Change, host::Reboot);
}

}  // namespace simulator

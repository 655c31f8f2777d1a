// The host's file: who may read it, who waits for it, and that no fault leaves half a change.
#include <CoreCtl/Storage.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <ima/ima.h>
#include <sqlite3.h>
#include <sys/stat.h>

#include <filesystem>
#include <fstream>
#include <functional>
#include <sstream>

#include "host/Host.h"
#include "host/Storage.h"
#include "simulator/Description.h"
#include "simulator/Simulator.h"
#include "support/Harness.h"

using host::Host;
using testing::HasSubstr;
using testing::ThrowsMessage;

namespace {

/// A change of the first adapter, as a command makes it.
void SetAlias(const std::string& alias) {
  CoreCtl::Storage::StorageInfoImpl info;
  const std::unique_ptr<NodeCtl::Storage::ScsiInterface> adapter(info.GetScsiInterface("hba0"));
  dynamic_cast<NodeCtl::Storage::iScsiInterface&>(*adapter).SetInitiatorAlias(alias);
}

/// A root of its own, with a host that this process makes.
class HostStore : public testing::Test {
 public:
  ~HostStore() override { Host::Use(nullptr); }

 protected:
  HostStore() { Host::Use(nullptr); }

  std::string File() const { return root_.Path() + "/var/lib/tessaro/host.db"; }

  TemporaryRoot root_;
};

TEST_F(HostStore, TheJournalIsItsOwnersAlone) {
  for (const mode_t mask : {0u, 0277u}) {
    std::filesystem::remove_all(root_.Path() + "/var");
    umask(mask);
    simulator::Show(false);
    Host::Use(nullptr);
    struct stat journal {};
    {
      host::Store store(File());
      const host::Transaction change(store, host::Transaction::Access::Change);
      store.Execute("UPDATE object SET kind = -kind");
      EXPECT_EQ(stat((File() + "-journal").c_str(), &journal), 0);
    }
    umask(022);
    EXPECT_EQ(journal.st_mode & 07777, 0600u);
  }
}

TEST_F(HostStore, AnEmptyRootIsNotThisMachine) {
  setenv("HCLI_ROOT", "", 1);  // the path alone: where this fails, a change would be one of this machine
  EXPECT_THAT([] { host::HostPath("/x"); },
              ThrowsMessage<host::Error>(testing::StartsWith("HCLI_ROOT is empty: ")));
}

TEST_F(HostStore, ALockThatStaysIsTold) {
  simulator::Show(false);
  host::Store other(File());
  const host::Transaction lock(other, host::Transaction::Access::Change);
  const int before = Host::SetPatience(10);
  EXPECT_NO_THROW(simulator::Show(true));  // who writes does not keep readers out
  EXPECT_THAT([] { SetAlias("x"); }, ThrowsMessage<NodeCtl::Lib::NodeCtlException>(
                                         HasSubstr(File() + " is locked by another process.")));
  EXPECT_EQ(Host::SetPatience(before), 10);
}

/// Which failures end the transaction: see https://www.sqlite.org/lang_transaction.html.
const struct {
  void (host::Store::*fail)(int number, int code);
  int code;
} kFaults[] = {
    {&host::Store::FailStatement, SQLITE_IOERR},   {&host::Store::FailStatement, SQLITE_FULL},
    {&host::Store::FailStatement, SQLITE_CORRUPT}, {&host::Store::FailStatement, SQLITE_BUSY},
    {&host::Store::FailStatement, SQLITE_NOMEM},   {&host::Store::FailTransaction, SQLITE_IOERR},
    {&host::Store::FailTransaction, SQLITE_FULL},  {&host::Store::FailTransaction, SQLITE_NOMEM},
};

TEST_F(HostStore, EachFailingStatementLeavesTheHostAsItWas) {
  const struct {
    const char* name;
    std::function<void()> change;
  } cases[] = {
      {"alias", [] { SetAlias("other"); }},
      {"disable", [] { CoreCtl::Storage::StorageInfoImpl().DisableSoftwareiScsi(); }},
      {"load", [] { simulator::Load(R"({"adapters": [{"name": "x"}, {"name": "y"}]})"); }},
  };
  for (const auto& [name, change] : cases) {
    for (const auto& [fail, code] : kFaults) {
      int number = 0;
      bool failed = true;
      while (failed) {
        simulator::Load(std::string(simulator::DemoDescription()));
        const std::string before = simulator::Show(true);
        host::Store& store = Host::Current().GetStore();
        (store.*fail)(++number, code);
        try {
          change();
          failed = false;
          EXPECT_FALSE(store.HasFailed()) << name << ": statement " << number << " failed in silence";
          store.FailStatement(0, 0);
          EXPECT_NE(simulator::Show(true), before) << name;
        } catch (const std::exception&) {
          EXPECT_EQ(simulator::Show(true), before) << name << ": statement " << number;
        }
      }
      EXPECT_GT(number, 4) << name;
    }
  }
}

TEST_F(HostStore, WhicheverStatementOfABatchFailsItsAnswersAreTrue) {
  const std::string path = root_.Path() + "/lines";
  std::ofstream(path) << "iscsi adapter set -A hba0 -a new0\niscsi adapter set -A hba1 -a new1\n"
                         "iscsi adapter set -A hba2 -a new2\n";
  for (const auto& [fail, code] : kFaults) {
    int refused = 0;
    for (int number = 1;; ++number) {
      Host::Use(simulator::HostOf(std::string(simulator::DemoDescription())));
      host::Store& store = Host::Current().GetStore();
      (store.*fail)(number, code);
      Plinth::TextConsole console;
      Plinth::RunCommandLine(CommandTree(), {"--batch", path, "--keep-going", "--output", "json"}, console);
      if (!store.HasFailed()) break;
      const auto adapters = nlohmann::json::parse(simulator::Show(true)).at("adapters");
      std::istringstream answers(console.out.text);
      for (std::size_t line = 0; line < 3; ++line) {
        std::string text;
        ASSERT_TRUE(std::getline(answers, text)) << console.error.text;
        const bool isDone = nlohmann::json::parse(text).at("status") == 0;
        EXPECT_EQ(adapters.at(line).at("alias") == "new" + std::to_string(line), isDone)
            << "statement " << number << ", code " << code << ": " << text;
        refused += !isDone;
      }
    }
    EXPECT_GT(refused, 6) << code;
  }
}

TEST_F(HostStore, WhileAnAdapterOrAListIsHeldAllIsReadFromOneState) {
  CoreCtl::Storage::StorageInfoImpl info;
  std::unique_ptr<NodeCtl::Storage::ScsiInterface> held(info.GetScsiInterface("hba0"));
  auto& adapter = dynamic_cast<NodeCtl::Storage::iScsiInterface&>(*held);
  host::Store other(File());
  other.SetPatience(0);
  const auto change = [&] {
    host::Transaction transaction(other, host::Transaction::Access::Change);
    host::Tree tree(other);
    host::Object hba0 = *tree.Find(host::kRoot, host::Kind::Adapter, "hba0");
    hba0.record.Set("alias", "theirs");
    tree.Update(hba0);
    transaction.Commit();
  };
  const auto isLocked = ThrowsMessage<host::Error>(HasSubstr("is locked by another process."));
  EXPECT_THAT(change, isLocked);
  adapter.SetInitiatorAlias("ours");  // ends what was read before
  change();
  EXPECT_EQ(adapter.GetInitiatorAlias(), "theirs");
  EXPECT_THAT(change, isLocked);
  held.reset();
  change();
  // So it is while a list of the management API is held, until the first of them is given back.
  IMA_OID_LIST *adapters, *plugins;
  ASSERT_EQ(IMA_GetLhbaOidList(&adapters), IMA_STATUS_SUCCESS);
  EXPECT_THAT(change, isLocked);
  ASSERT_EQ(IMA_GetPluginOidList(&plugins), IMA_STATUS_SUCCESS);
  EXPECT_EQ(IMA_FreeMemory(adapters), IMA_STATUS_SUCCESS);
  change();
  EXPECT_EQ(IMA_FreeMemory(plugins), IMA_STATUS_SUCCESS);
}

TEST(HostTree, ChildrenKeepTheirOrderAndIdsAreNeverUsedAgain) {
  const Harness harness(R"({"adapters": [{"name": "b"}, {"name": "a"}]})");
  Host::Current().Change(host::Call::OnHost("Rediscover"), [](host::Tree& tree) {
    const std::int64_t first = tree.ChildIds(host::kRoot, host::Kind::Adapter).at(0);
    host::Record record;
    record.Set("name", "c");
    const host::Object added = tree.InsertNew(host::kRoot, host::Kind::Adapter, record);
    tree.Remove(added.id);
    tree.Remove(first);
    EXPECT_GT(tree.InsertNew(host::kRoot, host::Kind::Adapter, record).id, added.id);
    const auto adapters = tree.Children(host::kRoot, host::Kind::Adapter);
    ASSERT_EQ(adapters.size(), 2u);
    EXPECT_EQ(adapters[0].name + adapters[1].name, "ac");
    EXPECT_THAT([&] { tree.InsertNew(host::kRoot, host::Kind::Adapter, record); },
                ThrowsMessage<host::Error>("The adapter \"c\" exists already."));
  });
}

}  // namespace

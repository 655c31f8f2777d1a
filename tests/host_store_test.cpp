// The host's file: how it comes into being, what is refused, and that no fault leaves half a change.
#include <CoreCtl/Storage.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sqlite3.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <functional>

#include "host/Description.h"
#include "host/Error.h"
#include "host/Host.h"
#include "support/Harness.h"

using host::Host;
using testing::AllOf;
using testing::HasSubstr;

namespace {

constexpr const char* kFile = "/var/lib/tessaro/host.db";

/// A root of its own, with no host in it yet.
class HostStore : public testing::Test {
 public:
  ~HostStore() override { Host::Use(nullptr); }

 protected:
  HostStore() { Host::Use(nullptr); }

  std::string File() const { return root_.Path() + kFile; }
  std::string Bytes() const { return std::filesystem::is_regular_file(File()) ? root_.Read(kFile) : ""; }

  /// Runs @p work in another process and gives its exit status: 0 where all went well.
  static int InProcess(const std::function<void()>& work) {
    const pid_t child = fork();
    if (child == 0) {
      try {
        work();
      } catch (const std::exception& error) {
        std::fprintf(stderr, "%s\n", error.what());
        _exit(1);
      }
      _exit(0);
    }
    int status = -1;
    waitpid(child, &status, 0);
    return status;
  }

  static void MakeHost() {
    Host::Current().Show(false);
    Host::Use(nullptr);
  }

  static std::string WhatFails(const std::function<void()>& work) {
    try {
      work();
      return "nothing";
    } catch (const host::Error& error) {
      EXPECT_EQ(error.GetKind(), host::Error::Kind::Failed);
      return error.what();
    } catch (const NodeCtl::Lib::NodeCtlException& error) {
      return error.what();
    }
  }

  TemporaryRoot root_;
};

/// A change of the first adapter, as a command makes it.
void SetAlias(const std::string& alias) {
  CoreCtl::Storage::StorageInfoImpl info;
  const std::unique_ptr<NodeCtl::Storage::ScsiInterface> adapter(info.GetScsiInterface("hba0"));
  dynamic_cast<NodeCtl::Storage::iScsiInterface&>(*adapter).SetInitiatorAlias(alias);
}

TEST_F(HostStore, AFirstRunMakesTheDemoHost) {
  for (const mode_t mask : {0u, 0277u}) {
    std::filesystem::remove_all(root_.Path() + "/var");
    std::filesystem::create_directories(root_.Path() + "/var/lib/tessaro");
    umask(mask);
    const std::string shown = Host::Current().Show(true);
    {
      host::Store store(File());
      const host::Transaction change(store, host::Transaction::Access::Change);
      store.Execute("UPDATE object SET place = -place");
      struct stat journal;
      EXPECT_EQ(stat((File() + "-journal").c_str(), &journal), 0);
      EXPECT_EQ(journal.st_mode & 07777, 0600u);
    }
    umask(022);
    Host::Use(Host::InMemory(std::string(host::DemoDescription())));
    EXPECT_EQ(shown, Host::Current().Show(true));
    Host::Use(nullptr);
    struct stat status;
    ASSERT_EQ(stat(File().c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, 0600u);
  }
}

// More that is damaged stands in the tests of the built program.
TEST_F(HostStore, WhatIsNoHostIsRefusedAndLeftAlone) {
  const struct {
    const char* reason;
    std::function<void()> spoil;
  } cases[] = {
      {"is damaged", [this] { std::filesystem::resize_file(File(), 50); }},
      {"no such table", [] { Host::Current().GetStore().Execute("DROP TABLE object"); }},
      {"belongs to a newer version",
       [] {
         host::Store& store = Host::Current().GetStore();
         const std::int64_t next = store.Number("PRAGMA user_version") + 1;
         store.Execute(("PRAGMA user_version=" + std::to_string(next)).c_str());
       }},
      {"is a symbolic link",
       [this] {
         std::filesystem::remove(File());
         std::filesystem::create_symlink("nowhere", File());
       }},
  };
  for (const auto& [reason, spoil] : cases) {
    std::filesystem::remove_all(root_.Path() + "/var");
    MakeHost();
    spoil();
    Host::Use(nullptr);
    const std::string before = Bytes();
    EXPECT_THAT(WhatFails([] { Host::Current().Show(true); }), AllOf(HasSubstr(File()), HasSubstr(reason)));
    // Through the libraries too: a lookup tells it in its own exception.
    EXPECT_THROW(CoreCtl::Storage::StorageInfoImpl().GetScsiInterface("hba0"), CoreCtl::Lib::CoreCtlException)
        << reason;
    EXPECT_EQ(Bytes(), before) << reason;
    Host::Use(nullptr);
  }
}

TEST_F(HostStore, WhatCannotBeWrittenIsTold) {
  if (geteuid() != 0) GTEST_SKIP() << "takes another user";
  MakeHost();
  // Root may write all. The folder's mode keeps the journal out.
  const auto asNobody = [](const std::string& outcome, const std::function<void()>& work) {
    EXPECT_EQ(InProcess([&] {
                if (setuid(65534) != 0) std::abort();
                const std::string what = WhatFails(work);
                if (what.find(outcome) == what.npos) throw std::runtime_error(outcome + ": " + what);
              }),
              0);
  };
  const auto show = [] { Host::Current().Show(true); };
  ASSERT_EQ(chmod(root_.Path().c_str(), 0755), 0);
  asNobody(File() + " cannot be opened: Permission denied", show);
  ASSERT_EQ(chmod(File().c_str(), 0644), 0);
  asNobody(File() + " cannot be written: it is read-only", [] { SetAlias("x"); });
  asNobody("nothing", show);
  std::filesystem::remove(File());
  asNobody(File() + " cannot be written: Permission denied", show);
  EXPECT_FALSE(std::filesystem::exists(File()));
}

TEST_F(HostStore, ALockThatStaysIsTold) {
  MakeHost();
  host::Store other(File());
  const host::Transaction lock(other, host::Transaction::Access::Change);
  Host::Current().GetStore().SetPatience(10);
  EXPECT_NO_THROW(Host::Current().Show(true));  // who writes does not keep readers out
  EXPECT_THAT(WhatFails([] { SetAlias("x"); }), HasSubstr(File() + " is locked by another process."));
}

TEST_F(HostStore, EachFailingStatementLeavesTheHostAsItWas) {
  const struct {
    const char* name;
    std::function<void()> change;
  } cases[] = {
      {"alias", [] { SetAlias("other"); }},
      {"disable", [] { CoreCtl::Storage::StorageInfoImpl().DisableSoftwareiScsi(); }},
      {"load", [] { Host::Current().Load(R"({"adapters": [{"name": "x"}, {"name": "y"}]})"); }},
  };
  for (const auto& [name, change] : cases) {
    for (const int code : {SQLITE_IOERR, SQLITE_FULL, SQLITE_CORRUPT, SQLITE_NOMEM}) {
      int number = 0;
      bool failed = true;
      while (failed) {
        Host::Current().Load(std::string(host::DemoDescription()));
        const std::string before = Host::Current().Show(true);
        host::Store& store = Host::Current().GetStore();
        store.FailStatement(++number, code);
        try {
          change();
          failed = false;
          EXPECT_FALSE(store.HasFailed()) << name << ": statement " << number << " failed in silence";
          store.FailStatement(0, 0);
          EXPECT_NE(Host::Current().Show(true), before) << name;
        } catch (const std::exception&) {
          EXPECT_EQ(Host::Current().Show(true), before) << name << ": statement " << number;
        }
      }
      EXPECT_GT(number, 4) << name;
    }
  }
}

TEST_F(HostStore, WhileAnAdapterIsHeldAllIsReadFromOneState) {
  MakeHost();
  CoreCtl::Storage::StorageInfoImpl info;
  std::unique_ptr<NodeCtl::Storage::ScsiInterface> held(info.GetScsiInterface("hba0"));
  auto& adapter = dynamic_cast<NodeCtl::Storage::iScsiInterface&>(*held);
  host::Store other(File());
  other.SetPatience(0);
  const auto change = [&] {
    host::Transaction transaction(other, host::Transaction::Access::Change);
    other.Execute("UPDATE object SET record = json_set(record, '$.alias', 'theirs') WHERE name = 'hba0'");
    transaction.Commit();
  };
  EXPECT_THAT(WhatFails(change), HasSubstr("is locked by another process."));
  adapter.SetInitiatorAlias("ours");  // ends what was read before
  change();
  EXPECT_EQ(adapter.GetInitiatorAlias(), "theirs");
  EXPECT_THAT(WhatFails(change), HasSubstr("is locked by another process."));
  held.reset();
  change();
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
    EXPECT_THROW(tree.InsertNew(host::kRoot, host::Kind::Adapter, record), host::Error);
    EXPECT_THROW(tree.Get(first, host::Kind::Adapter), host::Error);
    EXPECT_THROW(tree.Get(host::kRoot, host::Kind::Adapter), host::Error);
    EXPECT_EQ(tree.Above(adapters[1].id, host::Kind::Host)->id, host::kRoot);
    EXPECT_EQ(adapters[1].record.GetString("kind"), "independent");
  });
}

}  // namespace

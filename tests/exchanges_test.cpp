// Networks that make an operation wait, and machines that tell what is: what happens between the plan of an
// exchange and its outcome.
#include <sqlite3.h>

#include <functional>

#include "host/Host.h"
#include "host/Platform.h"
#include "host/Targets.h"
#include "simulator/Simulator.h"
#include "store/Document.h"
#include "support/Harness.h"

namespace {

using host::Kind;
using host::Record;
using testing::ElementsAre;
using testing::IsEmpty;
using Texts = std::vector<std::string>;

/// What another process does, which must not find the file locked.
template <class Change>
void Elsewhere(Change change) {
  host::Store store(host::Host::DatabasePath());
  store.SetPatience(0);
  host::Transaction transaction(store, host::Transaction::Access::Change);
  host::Tree tree(store);
  change(tree, *tree.Find(host::kRoot, Kind::Adapter, "a"));
  transaction.Commit();
}

/// While it lives, exchanges take time, and @p meanwhile happens in each of them.
class SlowPlatform final : public host::Platform {
 public:
  std::function<void()> meanwhile = [] {};
  std::uint32_t status = host::kDone;
  std::unique_ptr<host::Machine> (*machine)() = nullptr;
  Texts exchanges;
  std::string isid;  // of the login that was asked for last

  void Exchange(const std::string& line) {
    exchanges.push_back(line);
    Elsewhere([](host::Tree&, const host::Object&) {});
    meanwhile();
  }

  std::unique_ptr<host::Network> NetworkOf(host::Tree&) override {
    return std::make_unique<SlowNetwork>(*this);
  }
  std::unique_ptr<host::Machine> MachineOf(host::Tree&) override { return machine ? machine() : nullptr; }
  std::unique_ptr<host::Store> NewStore() override { return nullptr; }

 private:
  class SlowNetwork final : public host::Network {
   public:
    explicit SlowNetwork(SlowPlatform& platform) : platform_(platform) {}
    bool DoesWait() const override { return true; }
    host::SendTargetsAnswer SendTargets(const host::Request& request) override {
      platform_.Exchange("ask " + request.portal.host);
      host::SendTargetsAnswer answer;
      answer.targets = {{.name = "found", .alias = {}, .portals = {{{"192.0.2.7"}, 1}}}};
      return answer;
    }
    host::LoginAnswer Login(const host::LoginRequest& request) override {
      platform_.isid = request.isid;
      platform_.Exchange("login " + request.target + ' ' + request.isid.substr(11) + ' ' +
                         std::to_string(request.offer.firstBurstLength));
      host::LoginAnswer answer;
      answer.status = platform_.status;
      answer.tsih = 1;
      answer.offer = request.offer;
      return answer;
    }
    void Logout(const host::LogoutRequest& request) override {
      platform_.Exchange(
          "logout " + request.target + ' ' + request.isid.substr(11) +
          (request.session >= host::kFirstMachineId ? " " + std::to_string(request.session) : ""));
    }

   private:
    SlowPlatform& platform_;
  };
};

/// A host in a file, with an adapter "a" that knows the target "t" and asks 192.0.2.9 for more.
class Exchanges : public testing::Test {
 protected:
  Exchanges() {
    host::Host::Use(nullptr);
    simulator::Load(R"({"adapters": [{"name": "a", "initiatorName": "iqn.2026-11.org.example:host",
      "network": {"ipv4Address": "192.0.2.100"}, "capabilities": {"Sendtarget Discovery Settable": true},
      "staticTargets": [{"name": "t", "host": "192.0.2.1"}], "sendTargets": [{"host": "192.0.2.9"}]}]})");
    slow_.emplace();
  }

  void RemoveTarget() const {
    Elsewhere([](host::Tree& tree, const host::Object& adapter) {
      for (const Kind kind : {Kind::StaticTarget, Kind::Target}) {
        for (const std::int64_t id : tree.ChildIds(adapter.id, kind)) tree.Remove(id);
      }
    });
  }
  void SetFirstBurst(int bytes) const {
    Elsewhere([&](host::Tree& tree, host::Object adapter) {
      Record parameter;
      parameter.Set("current", bytes);
      Record parameters;
      parameters.Set("FirstBurstLength", parameter);
      adapter.record.Set("parameters", parameters);
      adapter.record = store::Complete(Kind::Adapter, adapter.record);
      tree.Update(adapter);
    });
  }
  void LogIn() const {
    Elsewhere([&](host::Tree& tree, const host::Object& adapter) {
      host::KnownTarget target = host::GetTarget(tree, host::TargetIds(tree, adapter.id).at(0));
      Record session;
      session.Set("isid", slow_->isid);
      tree.InsertNew(host::OwnObject(tree, target).id, Kind::Session, session);
    });
  }
  Texts Sessions() { return host_("iscsi session list").Column("Target"); }

  TemporaryRoot root_;
  Harness host_{"{}"};
  std::optional<SlowPlatform> slow_;
};

TEST_F(Exchanges, WhatHappensMeanwhileCounts) {
  const struct {
    const char* name;
    const char* line;
    std::function<void(int exchange)> meanwhile;  // counted from 1
    Texts exchanges;
    Texts sessions;
    const char* reason = "";
  } cases[] = {
      {"nothing", "-n t", [](int) {}, {"login t 1 65536"}, {"t"}},
      {"the target goes",
       "-n t",
       [&](int number) {
         if (number == 1) RemoveTarget();
       },
       {"login t 1 65536", "logout t 1"},
       {},
       "The target is gone."},
      {"a parameter changes",
       "-n t",
       [&](int number) {
         if (number == 1) SetFirstBurst(1024);
       },
       {"login t 1 65536", "logout t 1", "login t 1 1024"},
       {"t"}},
      {"it never stays as it was",
       "-n t",
       [&](int number) { SetFirstBurst(1024 + number); },
       {"login t 1 65536", "logout t 1", "login t 1 1025", "logout t 1", "login t 1 1027", "logout t 1",
        "login t 1 1029", "logout t 1"},
       {},
       "Others changed what the operation goes by each time that the network was asked."},
      {"another logs in, and one more is asked for",
       "-n t",
       [&](int number) {
         if (number == 1) LogIn();
       },
       {"login t 1 65536", "logout t 1", "login t 2 65536"},
       {"t", "t"}},
      {"another logs in where one is missing",
       "",
       [&](int number) {
         if (number == 1) LogIn();
       },
       {"login t 1 65536", "logout t 1"},
       {"t"}},
      {"the daemon is gone",
       "-n t",
       [](int) { throw host::Error(host::Error::Kind::NoAnswer, "No daemon."); },
       {"login t 1 65536"},
       {},
       "No daemon."},
      {"the adapter goes offline",
       "",
       [&](int number) {
         if (number != 1) return;
         Elsewhere([](host::Tree& tree, host::Object adapter) {
           adapter.record.Set("state", 1);
           tree.Update(adapter);
         });
       },
       {"login t 1 65536", "logout t 1"},
       {},
       "The adapter a is not online."},
  };
  const std::string before = simulator::Show(true);
  for (const auto& one : cases) {
    SCOPED_TRACE(one.name);
    simulator::Load(before);
    slow_->exchanges.clear();
    int number = 0;
    slow_->meanwhile = [&] { one.meanwhile(++number); };
    const Outcome run = host_(std::string("iscsi session add -A a ") + one.line);
    EXPECT_EQ(run.reasons.empty() ? "" : run.reasons[0].text, one.reason);
    EXPECT_EQ(slow_->exchanges, one.exchanges);
    EXPECT_EQ(Sessions(), one.sessions);
  }
}

TEST_F(Exchanges, DiscoveryAsksAndThenLogsIn) {
  host_("iscsi adapter discovery rediscover -A a");
  EXPECT_THAT(slow_->exchanges, ElementsAre("ask 192.0.2.9", "login t 1 65536", "login found 1 65536"));
  EXPECT_THAT(Sessions(), ElementsAre("t", "found"));
  slow_->exchanges.clear();
  simulator::Reboot();
  EXPECT_THAT(slow_->exchanges, ElementsAre("logout t 1", "logout found 1", "ask 192.0.2.9",
                                            "login t 1 65536", "login found 1 65536"));
  slow_->exchanges.clear();
  EXPECT_EQ(host_("iscsi session remove -A a").result, true);
  EXPECT_THAT(slow_->exchanges, ElementsAre("logout t 1", "logout found 1"));
  EXPECT_THAT(Sessions(), IsEmpty());
}

TEST_F(Exchanges, ADiscoveryThatIsDisturbedEachTimeEnds) {
  int number = 0;
  slow_->meanwhile = [&] {
    Elsewhere([&](host::Tree& tree, host::Object adapter) {
      adapter.record.Set("initiatorName", "iqn.2026-11.org.example:" + std::to_string(++number));
      tree.Update(adapter);
    });
  };
  EXPECT_EQ(host_("iscsi adapter discovery rediscover -A a").reasons.at(0).code, "busy");
  EXPECT_THAT(slow_->exchanges, testing::Each("ask 192.0.2.9"));
}

TEST_F(Exchanges, ARefusalIsKept) {
  slow_->status = host::kNotAllowed;
  const Outcome run = host_("iscsi session add -A a -n t");
  EXPECT_THAT(run.reasons.at(0).text, testing::HasSubstr("failed with status 0x0202"));
  EXPECT_THAT(host_("iscsi adapter target list").Column("Last Error"),
              ElementsAre(testing::StartsWith("0x0202 ")));
}

TEST_F(Exchanges, ADryRunAsksNothing) {
  EXPECT_EQ(host_("iscsi session add -A a --dry-run").status, 0);
  EXPECT_EQ(host_("iscsi adapter discovery rediscover -A a --dry-run").status, 0);
  EXPECT_THAT(slow_->exchanges, IsEmpty());
  EXPECT_THAT(Sessions(), IsEmpty());
}

TEST_F(Exchanges, WhatCannotBeStoredIsEnded) {
  host::Store& store = host::Host::Current().GetStore();
  for (int number = 1;; ++number) {
    slow_->exchanges.clear();
    bool isAsked = false;
    slow_->meanwhile = [&] {
      if (!isAsked) store.FailStatement(number, SQLITE_FULL);
      isAsked = true;
    };
    const Outcome run = host_("iscsi session add -A a -n t");
    const bool hasFailed = store.HasFailed() && run.result != nlohmann::json(true);
    store.FailStatement(0, 0);
    if (run.result == nlohmann::json(true)) {
      EXPECT_GT(number, 3);
      EXPECT_THAT(Sessions(), ElementsAre("t"));
      return;
    }
    ASSERT_TRUE(hasFailed);
    EXPECT_THAT(slow_->exchanges, ElementsAre("login t 1 65536", "logout t 1")) << number;
    EXPECT_THAT(Sessions(), IsEmpty()) << number;
  }
}

/// A session that somebody else has begun with a target that no adapter was told of.
class OneSession final : public host::Machine {
 public:
  std::vector<host::Object> Children(std::int64_t parent, Kind kind) override {
    std::vector<host::Object> children;
    for (std::int64_t id = host::kFirstMachineId; const auto object = Lookup(id); ++id) {
      // The host has one adapter, which no other object of the store is the parent of a target for.
      const bool isBelow = kind == Kind::Target ? parent < host::kFirstMachineId : object->parent == parent;
      if (object->kind == kind && isBelow) children.push_back(*object);
    }
    return children;
  }
  std::optional<host::Object> Lookup(std::int64_t id) override {
    constexpr std::int64_t first = host::kFirstMachineId;
    switch (id - first) {
      case 0:
        return Made(id, adapter, Kind::Target, "name", "theirs");
      case 1:
        return Made(id, first, Kind::Session, "isid", "800000000009");
      default:
        return {};
    }
  }
  static inline std::int64_t adapter = 0;

 private:
  static host::Object Made(std::int64_t id, std::int64_t parent, Kind kind, const char* key,
                           const char* text) {
    Record given;
    given.Set(key, text);
    host::Object object{
        .id = id, .parent = parent, .kind = kind, .name = {}, .record = store::Complete(kind, given)};
    object.name = store::NameOf(kind, object.record);
    return object;
  }
};

TEST_F(Exchanges, SessionsAreThoseOfTheMachine) {
  Elsewhere([](host::Tree&, const host::Object& adapter) { OneSession::adapter = adapter.id; });
  slow_->machine = []() -> std::unique_ptr<host::Machine> { return std::make_unique<OneSession>(); };
  EXPECT_THAT(Sessions(), ElementsAre("theirs"));
  EXPECT_THAT(host_("iscsi adapter target list").Column("Target"), ElementsAre("t", "theirs"));
  // What the host logs in to is the machine's to tell of.
  EXPECT_EQ(host_("iscsi session add -A a -n t").result, true);
  EXPECT_THAT(Sessions(), ElementsAre("theirs"));
  EXPECT_EQ(host_("iscsi session remove -A a").result, true);
  EXPECT_THAT(slow_->exchanges, ElementsAre("login t 1 65536", "logout theirs 9 281474976710657"));
  EXPECT_EQ(host::Host::Current().GetStore().Number("SELECT count(*) FROM object WHERE kind = 21"), 0);
}

}  // namespace

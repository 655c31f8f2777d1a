/// The objects of a host, as one operation sees and changes them: those of the store, and those of which the
/// machine tells.
#pragma once

#include <memory>
#include <optional>
#include <set>
#include <vector>

#include "host/Exchanges.h"
#include "host/Machine.h"
#include "host/Status.h"
#include "store/Tree.h"

#pragma GCC visibility push(default)

namespace host {

/// What is done to an object of the machine lasts until the operation ends, so that the operation sees what
/// it has done: the exchange with the network is what counts.
class Tree final : public store::Tree {
 public:
  using store::Tree::Tree;
  ~Tree() override;

  std::optional<Object> Lookup(std::int64_t id) override;
  const Object* Look(std::int64_t id) override;
  std::optional<Object> Find(std::int64_t parent, Kind kind, std::string_view name) override;
  std::vector<Object> Children(std::int64_t parent, Kind kind) override;
  std::vector<std::int64_t> ChildIds(std::int64_t parent, Kind kind) override;
  void ForEachChild(std::int64_t parent, Kind kind,
                    const std::function<void(std::int64_t id, const Record& record)>& visit) override;
  Object Insert(std::int64_t parent, Kind kind, Record record) override;
  std::int64_t Add(std::int64_t parent, Kind kind, std::string_view name, const Record& record) override;
  void Update(const Object& object) override;
  void Remove(std::int64_t id) override;

  /// Those of @p kind below @p parent of which the machine tells; none where there is no machine.
  std::vector<Object> OfMachine(std::int64_t parent, Kind kind);

  /// The network that the operation's adapters see.
  Network& GetNetwork();
  /// What was asked of it; null where nothing was.
  Exchanges* GetExchanges() { return exchanges_.get(); }

  /// An operation begins, or has ended; its work begins anew.
  void BeginOperation();
  void BeginAnew();

  /// The status that the description has the operation answer, where it does.
  const std::optional<Status>& Answer() const { return answer_; }
  void SetAnswer(std::optional<Status> status) { answer_ = status; }

 private:
  Machine* GetMachine();
  /// True where the machine alone tells of objects of that kind.
  bool IsOfMachine(Kind kind);

  bool isMachineKnown_ = false;
  std::unique_ptr<Machine> machine_;
  std::unique_ptr<Exchanges> exchanges_;
  std::vector<Object> made_;      // of the machine's kinds, by the operation
  std::set<std::int64_t> gone_;   // the same
  std::optional<Object> looked_;  // what Look has given last of the machine's
  std::optional<Status> answer_;
};

}  // namespace host

#pragma GCC visibility pop

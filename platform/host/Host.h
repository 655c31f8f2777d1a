/// The host, and the one point that every library operation passes.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <type_traits>

#include "host/Call.h"
#include "host/CallLog.h"
#include "host/Storage.h"
#include "host/Tree.h"

#pragma GCC visibility push(default)

namespace host {

class Host {
 public:
  /// The host of this process: the one given to Use, else the one under HCLI_ROOT, opened at the first call
  /// and made by its platform where there is none.
  static Host& Current();
  /// Makes @p host the current one. Null closes it, and the next Current() opens the one under HCLI_ROOT.
  static void Use(std::unique_ptr<Host> host);

  /// How long calls of this process wait for another one, in milliseconds. Returns what held before.
  static int SetPatience(int milliseconds);

  /// A dry run: what calls change from now on lasts until EndRehearsal undoes it, and is seen in this process
  /// alone. See Rehearsal and Store::BeginRehearsal.
  static void BeginRehearsal();
  /// The calls that have changed something since then, or since this was asked, as the trace shows them.
  static std::vector<std::string> TakeRehearsedCalls();
  static void EndRehearsal() noexcept;

  /// A group: what calls change from now on is kept back, to be made durable at once. See Store::BeginGroup.
  static void BeginGroup();
  /// False once Settle has ended the group, and where what was changed is lost.
  static bool IsGroupOpen() noexcept;
  /// Ends the group. False where nothing of it could be kept.
  static bool CommitGroup() noexcept;
  /// Makes durable what a group keeps back, and ends it; an Error where that fails. Asked for ahead of all
  /// that would not be undone with the group, and of all that others should not have to wait for.
  void Settle();

  static std::unique_ptr<Host> InMemory(std::unique_ptr<Store> store);

  /// Runs @p body with a Tree& as the work of @p call: in one transaction, whole or not at all, durable when
  /// it returns. Answers of the description go before the body or instead of it, and the trace gets its line.
  /// Throws Error and std::bad_alloc, nothing else. The body of an operation that gives a status returns
  /// Status. An Error that a body returns is thrown when its work is stored.
  template <class Body>
  auto Read(const Call& call, Body&& body) {
    return Run(call, Transaction::Access::Read, body);
  }
  template <class Body>
  auto Change(const Call& call, Body&& body) {
    return Run(call, Transaction::Access::Change, body);
  }
  /// The same for work that happens outside the database: @p body takes no argument and runs in no
  /// transaction of its own.
  template <class Body>
  auto Outside(const Call& call, Body&& body) {
    return Traced(call, [&] {
      {
        Step step(*this, Transaction::Access::Read);
        HearAnswers(call, step.GetTree());
        step.Commit();
      }
      return body();
    });
  }

  /// Runs @p work in one transaction, neither traced nor answered, for what a platform does to the host as a
  /// whole. @p call is what a rehearsal shows of a change, and @p check finds out whether the store is fit
  /// for it.
  void Administer(const char* call, Transaction::Access access, const std::function<void(Tree&)>& work,
                  void (Store::*check)() = &Store::CheckStructure);

  /// The file of the host under HCLI_ROOT. An Error where that is empty.
  static std::string DatabasePath();
  /// Opens the store where that was not done yet.
  Store& GetStore();

 private:
  Host(std::string path, std::unique_ptr<Store> store);

  /// The transactions of one operation. While it asks something of a network that makes it wait, none is
  /// open.
  class Step {
   public:
    Step(Host& host, Transaction::Access access);
    Step(const Step&) = delete;
    Step& operator=(const Step&) = delete;
    ~Step();
    Tree& GetTree() { return tree_; }
    /// Keeps what was done. False where that was a plan only, and is to be done anew: see Exchanges.
    bool Commit();

   private:
    Reading reading_;  // so that opening the store and the work itself read once
    Host& host_;
    Transaction::Access access_;
    std::optional<Transaction> transaction_;
    Tree& tree_;
  };

  template <class Body>
  auto Run(const Call& call, Transaction::Access access, Body& body) {
    using Result = std::invoke_result_t<Body&, Tree&>;
    constexpr bool mayFailAfterAll = std::is_same_v<Result, std::optional<Error>>;
    return Traced(call, [&]() -> std::conditional_t<mayFailAfterAll, void, Result> {
      Step step(*this, access);
      Tree& tree = step.GetTree();
      HearAnswers(call, tree);
      if constexpr (std::is_void_v<Result>) {
        do body(tree);
        while (!step.Commit());
      } else {
        const std::optional<Status> answer = tree.Answer();
        if constexpr (std::is_same_v<Result, Status>) {
          if (answer == Status::NotSupported) return Status::NotSupported;
        }
        for (;;) {
          Result result = body(tree);
          if (!step.Commit()) continue;
          if constexpr (mayFailAfterAll) {
            if (result) throw Error(*result);
            return;
          } else if constexpr (std::is_same_v<Result, Status>) {
            return answer.value_or(result);
          } else {
            return result;
          }
        }
      }
    });
  }

  template <class Work>
  auto Traced(const Call& call, Work work) -> std::invoke_result_t<Work&> {
    using Result = std::invoke_result_t<Work&>;
    try {
      const std::int64_t changes = RehearsedChanges();
      if constexpr (std::is_void_v<Result>) {
        work();
        NoteRehearsed(call, changes);
        CallLog::Current().Gave(call);
        if (call.traced) TraceSuccess(call, "ok");
      } else {
        Result result = work();
        NoteRehearsed(call, changes);
        Log(call, result);
        if (call.traced) TraceSuccess(call, OutcomeText(result));
        return result;
      }
    } catch (...) {
      Fail(call);
    }
  }

  template <class Result>
  static void Log(const Call& call, const Result& result) {
    CallLog& log = CallLog::Current();
    if constexpr (std::is_same_v<Result, Status>) {
      log.Gave(call, result);
    } else if constexpr (requires { result == nullptr; }) {
      result == nullptr ? log.GaveNothing(call) : log.Gave(call);
    } else {
      log.Gave(call);
    }
  }

  template <class Result>
  static std::string OutcomeText(const Result& result) {
    if constexpr (std::is_same_v<Result, Status>) {
      return std::to_string(static_cast<int>(result));
    } else if constexpr (std::is_constructible_v<Argument, const Result&>) {
      return Argument(result).Text();
    } else if constexpr (requires { result == nullptr; }) {
      return result == nullptr ? "null" : "ok";
    } else {
      return "ok";
    }
  }

  /// Lets the answers of the description have their say: throws, or @p tree knows the status to give.
  void HearAnswers(const Call& call, Tree& tree);
  /// The operations that the description has answered; as they are in the transaction that @p tree reads in.
  const std::vector<Object>& Answers(Tree& tree);
  /// How many changes this rehearsal has seen; 0 where there is none.
  std::int64_t RehearsedChanges();
  /// Undoes what the store keeps back, and closes it where that takes it. Calls are counted as before.
  void UndoAll() noexcept;
  /// Takes note of a call behind which there are more than @p before.
  void NoteRehearsed(const Call& call, std::int64_t before);
  void TraceSuccess(const Call& call, const std::string& outcome);
  /// The adapter that the call was on; empty where it cannot be told any more.
  std::string AdapterOf(const Call& call, const Error& error);
  /// The error, with the file's name where what is in it makes no sense.
  Error Located(const Error& error);
  /// Traces the exception being handled and throws it on, as an Error or std::bad_alloc.
  [[noreturn]] void Fail(const Call& call);

  std::string path_;  // empty in memory, and before the host of this process is opened
  std::unique_ptr<Store> store_;
  std::optional<Tree> tree_;  // of the store, from one call to the next
  std::vector<Object> answers_;
  std::uint64_t answersState_ = 0;  // of the store, when they were read
  std::map<std::string, int, std::less<>>
      calls_;  // how often each operation, and each on an adapter, was called
  std::map<std::string, int, std::less<>> callsBefore_;  // the same when the rehearsal or the group began
  bool isGrouping_ = false;
  bool isStoreRehearsed_ = false;  // the store is this rehearsal's alone
};

/// Takes the lines of the trace, besides HCLI_TRACE=1 in the environment, which writes them to standard
/// error. Null ends it.
void SetTraceSink(std::function<void(const std::string& line)> sink);

}  // namespace host

#pragma GCC visibility pop

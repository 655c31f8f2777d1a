/// The simulated host, and the one point that every library operation passes.
#pragma once

#include <functional>
#include <map>
#include <memory>
#include <string>
#include <type_traits>

#include "host/Call.h"
#include "host/Error.h"
#include "host/Tree.h"

#pragma GCC visibility push(default)

namespace host {

/// What an IMA call answers that did its work and still has to report a failure.
enum class ImaStatus : std::uint32_t { Success = 0 };
/// As the trace shows it.
std::string ImaStatusText(std::uint32_t status);

class Host {
 public:
  /// The host of this process: the one given to Use, else the one under HCLI_ROOT, opened at the first call
  /// and made from the demo description where there is none.
  static Host& Current();
  /// Makes @p host the current one. Null closes it, and the next Current() opens the one under HCLI_ROOT.
  static void Use(std::unique_ptr<Host> host);

  static std::unique_ptr<Host> InMemory(const std::string& description);
  /// The host in the file @p path, which is made where it does not exist. Nothing is opened before it is
  /// needed.
  static std::unique_ptr<Host> InFile(const std::string& path);

  /// Runs @p body with a Tree& as the work of @p call: in one transaction, whole or not at all, durable when
  /// it returns. Answers of the description go before the body or instead of it, and the trace gets its line.
  /// Throws Error and std::bad_alloc, nothing else. The body of an operation that gives a status returns
  /// Status.
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
      Begun(*this, call, Transaction::Access::Read).Commit();
      return body();
    });
  }

  /// For the simulator's own use: neither traced nor answered.
  void Load(const std::string& description);
  std::string Show(bool secrets);
  void Reboot();

  /// Opens the store where that was not done yet.
  Store& GetStore();

 private:
  Host(std::string path, std::unique_ptr<Store> store) : path_(std::move(path)), store_(std::move(store)) {}

  template <class Work>
  void Simulate(Transaction::Access access, Work work);

  /// A transaction in which the answers have had their say: it throws, or its tree knows the status to give.
  class Begun {
   public:
    Begun(Host& host, const Call& call, Transaction::Access access);
    void Commit() { transaction_.Commit(); }
    Tree& GetTree() { return tree_; }

   private:
    Reading reading_;  // so that opening the store and the work itself read once
    Transaction transaction_;
    Tree tree_;
  };

  template <class Body>
  auto Run(const Call& call, Transaction::Access access, Body& body) {
    using Result = std::invoke_result_t<Body&, Tree&>;
    return Traced(call, [&]() -> Result {
      Begun begun(*this, call, access);
      if constexpr (std::is_void_v<Result>) {
        body(begun.GetTree());
        begun.Commit();
      } else if constexpr (std::is_same_v<Result, Status>) {
        const std::optional<Status>& answer = begun.GetTree().Answer();
        if (answer == Status::NotSupported) return Status::NotSupported;
        const Status status = body(begun.GetTree());
        begun.Commit();
        return answer.value_or(status);
      } else {
        Result result = body(begun.GetTree());
        begun.Commit();
        return result;
      }
    });
  }

  template <class Work>
  auto Traced(const Call& call, Work work) -> std::invoke_result_t<Work&> {
    using Result = std::invoke_result_t<Work&>;
    try {
      if constexpr (std::is_void_v<Result>) {
        work();
        TraceSuccess(call, "ok");
      } else {
        Result result = work();
        if (IsTracing()) TraceSuccess(call, OutcomeText(result));
        return result;
      }
    } catch (...) {
      Fail(call);
    }
  }

  template <class Result>
  static std::string OutcomeText(const Result& result) {
    if constexpr (std::is_same_v<Result, Status>) {
      return std::to_string(static_cast<int>(result));
    } else if constexpr (std::is_same_v<Result, ImaStatus>) {
      return ImaStatusText(static_cast<std::uint32_t>(result));
    } else if constexpr (std::is_constructible_v<Argument, const Result&>) {
      return Argument(result).Text();
    } else if constexpr (requires { result == nullptr; }) {
      return result == nullptr ? "null" : "ok";
    } else {
      return "ok";
    }
  }

  static bool IsTracing();
  void TraceSuccess(const Call& call, const std::string& outcome);
  /// The error, with the file's name where what is in it makes no sense.
  Error Located(const Error& error);
  /// Traces the exception being handled and throws it on, as an Error or std::bad_alloc.
  [[noreturn]] void Fail(const Call& call);

  std::string path_;  // empty in memory
  std::unique_ptr<Store> store_;
  std::map<std::string, int, std::less<>>
      calls_;  // how often each operation, and each on an adapter, was called
};

/// Takes the lines of the trace, besides HCLI_TRACE=1 in the environment, which writes them to standard
/// error. Null ends it.
void SetTraceSink(std::function<void(const std::string& line)> sink);

}  // namespace host

#pragma GCC visibility pop

#include "host/Host.h"

#include <sys/stat.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>
#include <utility>

#include "host/Failure.h"
#include "host/Platform.h"
#include "host/Storage.h"
#include "store/Rehearsal.h"

namespace host {

namespace {

std::unique_ptr<Host>& CurrentHost() {
  // Not closed when the process ends: no transaction is open then, and the rest is gone by itself.
  static auto& current = *new std::unique_ptr<Host>;
  return current;
}

std::function<void(const std::string&)>& TraceSink() {
  static std::function<void(const std::string&)> sink;
  return sink;
}

bool IsTraceWanted() {
  // A walk makes thousands of calls, and in the middle of one nothing sets a variable.
  static std::uint64_t asked = 0;
  static bool isWanted = false;
  const std::uint64_t reading = Reading::Current();
  if (reading == 0 || reading != asked) {
    const char* variable = std::getenv("HCLI_TRACE");
    isWanted = variable != nullptr && std::strcmp(variable, "1") == 0;
    asked = reading;
  }
  return isWanted;
}

void Trace(const Call& call, const std::string& outcome) {
  const std::string line =
      Printable(std::string(call.operation.Name()) + "(" + call.arguments + ") " + outcome);
  if (TraceSink()) TraceSink()(line);
  if (!IsTraceWanted()) return;
  if (Rehearsal* rehearsal = Rehearsal::Current()) return rehearsal->trace.push_back(line);
  std::fprintf(stderr, "%s\n", line.c_str());
}

}  // namespace

void SetTraceSink(std::function<void(const std::string&)> sink) { TraceSink() = std::move(sink); }

Host& Host::Current() {
  std::unique_ptr<Host>& current = CurrentHost();
  if (current == nullptr) current.reset(new Host("", nullptr));
  return *current;
}

void Host::Use(std::unique_ptr<Host> host) { CurrentHost() = std::move(host); }

Host::Host(std::string path, std::unique_ptr<Store> store)
    : path_(std::move(path)), store_(std::move(store)) {
  if (store_ != nullptr) tree_.emplace(*store_);
}

int Host::SetPatience(int milliseconds) {
  const std::unique_ptr<Host>& current = CurrentHost();
  if (current != nullptr && current->store_ != nullptr) current->store_->SetPatience(milliseconds);
  return host::SetPatience(milliseconds);
}

void Host::BeginRehearsal() {
  Host& host = Current();
  host.callsBefore_ = host.calls_;
  Rehearsal::Begin();
  if (host.store_ != nullptr) host.store_->BeginRehearsal();
}

std::vector<std::string> Host::TakeRehearsedCalls() { return std::exchange(Rehearsal::Current()->calls, {}); }

void Host::EndRehearsal() noexcept {
  const std::vector<std::string> trace = std::move(Rehearsal::Current()->trace);
  Rehearsal::End();
  CurrentHost()->UndoAll();
  for (const std::string& line : trace) std::fprintf(stderr, "%s\n", line.c_str());
}

void Host::UndoAll() noexcept {
  calls_.swap(callsBefore_);
  // Closing a file undoes what is not committed, too.
  const bool isUndone = store_ == nullptr || store_->UndoAll() || path_.empty();
  if (!isUndone || isStoreRehearsed_) {
    tree_.reset();
    store_.reset();
    answersState_ = 0;
  }
  isStoreRehearsed_ = false;
}

void Host::BeginGroup() {
  Host& host = Current();
  host.callsBefore_ = host.calls_;
  host.isGrouping_ = !IsTraceWanted();  // who reads the trace may keep it waiting
  if (host.isGrouping_ && host.store_ != nullptr) host.store_->BeginGroup();
}

bool Host::IsGroupOpen() noexcept {
  const Host& host = *CurrentHost();
  return host.isGrouping_ && (host.store_ == nullptr || !host.store_->IsGroupLost());
}

void Host::Settle() {
  if (!isGrouping_) return;
  if (store_ != nullptr) store_->CommitGroup();
  isGrouping_ = false;
}

bool Host::CommitGroup() noexcept {
  Host& host = *CurrentHost();
  try {
    host.Settle();
    return true;
  } catch (const std::exception&) {
    host.isGrouping_ = false;
    host.UndoAll();
    return false;
  }
}

std::unique_ptr<Host> Host::InMemory(std::unique_ptr<Store> store) {
  return std::unique_ptr<Host>(new Host("", std::move(store)));
}

std::string Host::DatabasePath() { return HostPath("/var/lib/tessaro/host.db"); }

Store& Host::GetStore() {
  if (store_ != nullptr) return *store_;
  if (path_.empty()) path_ = DatabasePath();
  struct stat status;
  if (!IsRegularFile("The host database", path_, status)) {
    RequireNoJournalAlone(path_);
    if (Rehearsal::Current() != nullptr) {
      isStoreRehearsed_ = true;
      store_ = Platform::Current().NewStore();
      store_->BeginRehearsal();
      tree_.emplace(*store_);
      return *store_;
    }
    // Built whole before it gets its name: nobody ever opens half a host, and the first of two wins.
    const std::string bytes = Platform::Current().NewStore()->Serialize();
    MakeFoldersFor(path_);
    NewFile file(path_);
    file.Write(bytes);
    file.Publish();
  } else {
    ClearLeftover(path_);
  }
  store_ = std::make_unique<Store>(path_);
  if (Rehearsal::Current() != nullptr) store_->BeginRehearsal();
  if (isGrouping_) store_->BeginGroup();
  tree_.emplace(*store_);
  return *store_;
}

Error Host::Located(const Error& error) {
  if (error.GetKind() != Error::Kind::Damaged) return error;
  return Error(Error::Kind::DamagedFile,
               "The host database " + GetStore().GetPath() + " is damaged: " + error.what() + ".");
}

void Host::Administer(const char* call, Transaction::Access access, const std::function<void(Tree&)>& work,
                      void (Store::*check)()) try {
  (GetStore().*check)();
  {
    Step step(*this, access);
    do work(step.GetTree());
    while (!step.Commit());
  }
  Rehearsal* const rehearsal = Rehearsal::Current();
  if (rehearsal != nullptr && access == Transaction::Access::Change) rehearsal->calls.emplace_back(call);
} catch (const Error& error) {
  throw Located(error);
}

Host::Step::Step(Host& host, Transaction::Access access)
    : host_(host), access_(access), transaction_(std::in_place, host.GetStore(), access), tree_(*host.tree_) {
  tree_.BeginOperation();
}

Host::Step::~Step() {
  transaction_.reset();
  tree_.BeginOperation();  // which ends the sessions of one that has failed
}

bool Host::Step::Commit() {
  Exchanges* const exchanges = tree_.GetExchanges();
  if (exchanges != nullptr && exchanges->ArePlanned()) {
    transaction_.reset();
    host_.Settle();
    exchanges->Perform();
    transaction_.emplace(host_.GetStore(), access_);
    tree_.BeginAnew();
    return false;
  }
  transaction_->Commit();
  if (exchanges != nullptr) exchanges->Keep();
  return true;
}

void Host::HearAnswers(const Call& call, Tree& tree) {
  const std::vector<Object>& answers = Answers(tree);
  if (answers.empty()) return;  // who it is that calls matters to answers alone
  std::string adapter = call.adapter;
  if (call.object != 0) {
    if (const auto object = tree.Above(call.object, Kind::Adapter)) adapter = object->name;
  }
  const std::string operation(call.operation.Name());
  const int count = ++calls_[operation];
  const int countOnAdapter = adapter.empty() ? 0 : ++calls_[operation + " " + adapter];
  for (const Object& object : answers) {
    const Record& answer = object.record;
    if (answer.GetString("operation") != operation) continue;
    const bool ofAdapter = answer.Has("adapter");
    if (ofAdapter && answer.GetString("adapter") != adapter) continue;
    if (answer.Has("call") && answer.GetInt("call") != (ofAdapter ? countOnAdapter : count)) continue;
    if (answer.Has("throw")) {
      const std::string text = answer.Has("text") ? answer.GetString("text") : "";
      switch (answer.GetWord("throw", kThrown)) {
        case 0:
          throw AnsweredError(AnsweredError::Thrown::NodeCtlException, text);
        case 1:
          throw AnsweredError(AnsweredError::Thrown::CoreCtlException, text);
        default:
          throw std::bad_alloc();
      }
    }
    if (answer.Has("imaStatus")) {
      const auto status = static_cast<std::uint32_t>(answer.GetInt64("imaStatus"));
      if (status != 0) throw AnsweredError(status);
    } else {
      tree.SetAnswer(static_cast<Status>(answer.GetInt("status")));
    }
    return;
  }
}

const std::vector<Object>& Host::Answers(Tree& tree) {
  if (const std::uint64_t state = store_->GetState(); state != answersState_) {
    answers_ = tree.Children(kRoot, Kind::Answer);
    answersState_ = state;
  }
  return answers_;
}

bool IsTracing() { return TraceSink() != nullptr || IsTraceWanted() || Rehearsal::Current() != nullptr; }

std::int64_t Host::RehearsedChanges() {
  const Rehearsal* rehearsal = Rehearsal::Current();
  return rehearsal == nullptr ? 0 : GetStore().CountChanges() + rehearsal->FileChanges();
}

void Host::NoteRehearsed(const Call& call, std::int64_t before) {
  Rehearsal* const rehearsal = Rehearsal::Current();
  if (rehearsal == nullptr || RehearsedChanges() == before) return;
  rehearsal->calls.push_back(Printable(std::string(call.operation.Name()) + "(" + call.arguments + ")"));
}

void Host::TraceSuccess(const Call& call, const std::string& outcome) {
  if (IsTraceWanted() && store_ != nullptr) store_->EndReading();  // who reads the trace may keep it waiting
  Trace(call, "= " + (call.style == Call::Style::Ima && outcome == "ok" ? ImaStatusText(0) : outcome));
}

std::string Host::AdapterOf(const Call& call, const Error& error) {
  // Whatever keeps the file locked would be waited for once more.
  if (call.object == 0 || store_ == nullptr || error.GetKind() == Error::Kind::Busy) return call.adapter;
  try {
    const Transaction transaction(*store_, Transaction::Access::Read);
    const auto adapter = Tree(*store_).Above(call.object, Kind::Adapter);
    return adapter ? adapter->name : "";
  } catch (const std::exception&) {
    return "";
  }
}

void Host::Fail(const Call& call) {
  try {
    if (store_ != nullptr) store_->EndReading();  // what was read is of no more use
  } catch (const Error&) {
    // What is told is why the call failed.
  }
  const auto tell = [&](const Error& error, const char* exception) {
    CallLog::Current().Failed(call, AdapterOf(call, error), error);
    if (!call.traced) return;
    const std::string outcome = call.style == Call::Style::Ima ? "= " + ImaStatusText(ImaStatusOf(error))
                                                               : std::string("! ") + exception;
    const std::string text = error.what();
    Trace(call, outcome + (text.empty() ? "" : ": " + text));
  };
  const auto tellError = [&](const Error& error) {
    const bool coreCtl = ThrownFor(error, call.style) == AnsweredError::Thrown::CoreCtlException;
    tell(error, coreCtl ? "CoreCtlException" : "NodeCtlException");
  };
  const auto fail = [&](const Error& error) {
    tellError(error);
    throw error;
  };
  try {
    throw;
  } catch (const std::bad_alloc&) {
    tell(Error(Error::Kind::NoMemory, "out of memory"), "std::bad_alloc");
    throw;
  } catch (const Error& error) {
    if (error.GetKind() == Error::Kind::Damaged) fail(Located(error));
    tellError(error);
    throw;
  } catch (const std::exception& error) {
    fail(Error(Error::Kind::Failed, error.what()));
  }
  std::abort();
}

}  // namespace host

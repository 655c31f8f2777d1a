#include "host/Host.h"

#include <sys/stat.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>

#include "host/Description.h"
#include "host/Files.h"
#include "host/Restart.h"

namespace host {

namespace {

constexpr std::string_view kDatabase = "/var/lib/tessaro/host.db";

std::unique_ptr<Host>& CurrentHost() {
  static std::unique_ptr<Host> current;
  return current;
}

std::function<void(const std::string&)>& TraceSink() {
  static std::function<void(const std::string&)> sink;
  return sink;
}

bool IsTraceWanted() {
  const char* variable = std::getenv("HCLI_TRACE");
  return variable != nullptr && std::strcmp(variable, "1") == 0;
}

void Trace(const Call& call, const std::string& outcome) {
  const std::string line = std::string(call.operation.Name()) + "(" + call.arguments + ") " + outcome;
  if (TraceSink()) TraceSink()(line);
  if (IsTraceWanted()) std::fprintf(stderr, "%s\n", line.c_str());
}

std::unique_ptr<Store> DescribedStore(const std::string& description) {
  auto store = std::make_unique<Store>();
  Transaction transaction(*store, Transaction::Access::Change);
  CreateTables(*store);
  Tree tree(*store);
  LoadDescription(tree, description);
  transaction.Commit();
  return store;
}

}  // namespace

std::string ImaStatusText(std::uint32_t status) {
  char text[16];
  std::snprintf(text, sizeof text, "0x%08x", static_cast<unsigned>(status));
  return text;
}

void SetTraceSink(std::function<void(const std::string&)> sink) { TraceSink() = std::move(sink); }

Host& Host::Current() {
  std::unique_ptr<Host>& current = CurrentHost();
  if (current == nullptr) current = InFile(HostPath(kDatabase));
  return *current;
}

void Host::Use(std::unique_ptr<Host> host) { CurrentHost() = std::move(host); }

std::unique_ptr<Host> Host::InMemory(const std::string& description) {
  return std::unique_ptr<Host>(new Host("", DescribedStore(description)));
}

std::unique_ptr<Host> Host::InFile(const std::string& path) {
  return std::unique_ptr<Host>(new Host(path, nullptr));
}

Store& Host::GetStore() {
  if (store_ != nullptr) return *store_;
  struct stat status;
  if (!IsRegularFile("The host database", path_, status)) {
    for (const std::string& journal : JournalsOf(path_)) {
      // A new host would take the changes in it for its own. What another process has just made is no matter.
      if (lstat(journal.c_str(), &status) != 0 || lstat(path_.c_str(), &status) == 0) continue;
      throw Error(Error::Kind::Failed, "The host database " + path_ + " is gone, and its journal " + journal +
                                           " is still there: put the database back, or remove the journal"
                                           " for a new host.");
    }
    // Built whole before it gets its name: nobody ever opens half a host, and the first of two wins.
    const std::string bytes = DescribedStore(std::string(DemoDescription()))->Serialize();
    MakeFoldersFor(path_);
    NewFile file(path_);
    file.Write(bytes);
    file.Publish();
  }
  store_ = std::make_unique<Store>(path_);
  return *store_;
}

Error Host::Located(const Error& error) {
  if (error.GetKind() != Error::Kind::Damaged) return error;
  return Error(Error::Kind::Failed,
               "The host database " + GetStore().GetPath() + " is damaged: " + error.what() + ".");
}

template <class Work>
void Host::Simulate(Transaction::Access access, Work work) try {
  GetStore().CheckStructure();
  Transaction transaction(GetStore(), access);
  Tree tree(GetStore());
  work(tree);
  transaction.Commit();
} catch (const Error& error) {
  throw Located(error);
}

void Host::Load(const std::string& description) {
  // A page written before its time would lock out readers for the whole of a long load.
  GetStore().Execute("PRAGMA cache_spill=off");
  Simulate(Transaction::Access::Change, [&](Tree& tree) { LoadDescription(tree, description); });
}

std::string Host::Show(bool secrets) {
  std::string text;
  Simulate(Transaction::Access::Read, [&](Tree& tree) { text = ShowDescription(tree, secrets); });
  return text;
}

void Host::Reboot() { Simulate(Transaction::Access::Change, host::Reboot); }

Host::Begun::Begun(Host& host, const Call& call, Transaction::Access access)
    : transaction_(host.GetStore(), access), tree_(host.GetStore()) {
  const std::vector<Object> answers = tree_.Children(kRoot, Kind::Answer);
  if (answers.empty()) return;  // who it is that calls matters to answers alone
  std::string adapter = call.adapter;
  if (call.object != 0) {
    if (const auto object = tree_.Above(call.object, Kind::Adapter)) adapter = object->name;
  }
  const std::string operation(call.operation.Name());
  const int count = ++host.calls_[operation];
  const int countOnAdapter = adapter.empty() ? 0 : ++host.calls_[operation + " " + adapter];
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
          throw Error(Error::Thrown::NodeCtlException, text);
        case 1:
          throw Error(Error::Thrown::CoreCtlException, text);
        default:
          throw std::bad_alloc();
      }
    }
    if (answer.Has("imaStatus")) {
      const auto status = static_cast<std::uint32_t>(answer.GetInt64("imaStatus"));
      if (status != 0) throw Error(status);
    } else {
      tree_.SetAnswer(static_cast<Status>(answer.GetInt("status")));
    }
    return;
  }
}

bool Host::IsTracing() { return TraceSink() != nullptr || IsTraceWanted(); }

void Host::TraceSuccess(const Call& call, const std::string& outcome) {
  if (!IsTracing()) return;
  if (IsTraceWanted() && store_ != nullptr) store_->EndReading();  // who reads the trace may keep it waiting
  Trace(call, "= " + (call.style == Call::Style::Ima && outcome == "ok" ? ImaStatusText(0) : outcome));
}

void Host::Fail(const Call& call) {
  if (store_ != nullptr)
    store_->EndReading();  // what was read is of no more use, and a report may have to wait
  const auto trace = [&](std::uint32_t imaStatus, const char* exception, const std::string& text) {
    if (!IsTracing()) return;
    const std::string outcome =
        call.style == Call::Style::Ima ? "= " + ImaStatusText(imaStatus) : std::string("! ") + exception;
    Trace(call, outcome + (text.empty() ? "" : ": " + text));
  };
  const auto fail = [&](const Error& error) {
    const bool coreCtl = error.GetThrown() == Error::Thrown::CoreCtlException ||
                         (error.GetThrown() == Error::Thrown::Usual && call.style == Call::Style::Lookup);
    trace(error.ImaStatus(), coreCtl ? "CoreCtlException" : "NodeCtlException", error.what());
    throw error;
  };
  try {
    throw;
  } catch (const std::bad_alloc&) {
    trace(0x80000002u, "std::bad_alloc", "");
    throw;
  } catch (const Error& error) {
    fail(Located(error));
  } catch (const std::exception& error) {
    fail(Error(Error::Kind::Failed, error.what()));
  }
  std::abort();
}

}  // namespace host

#include "host/CallLog.h"

#include <algorithm>
#include <new>

namespace host {

namespace {

constinit CallLog current;

std::string SentenceFor(const std::string& what, Effect waitsFor) {
  if (waitsFor == Effect::Now) return what + " was reset.";
  return "A change of " + what +
         (waitsFor == Effect::Reset ? " waits for a reset of it." : " waits for the host to boot again.");
}

}  // namespace

CallLog& CallLog::Current() { return current; }

void CallLog::Begin() noexcept {
  failure_.reset();
  notes_.clear();
}

template <class Make>
void CallLog::Keep(Make make, bool isResult) noexcept {
  failure_.reset();
  isResult_ = isResult;
  try {
    failure_ = make();
  } catch (const std::bad_alloc&) {
  }
}

void CallLog::Failed(const Call& call, const std::string& adapter, const Error& error) noexcept {
  const auto make = [&] {
    std::string text = error.what();
    if (text.empty()) text = std::string(call.operation.Name()) + " failed, and gave no reason.";
    return FailedCall{std::string(call.operation.Name()), adapter, error.Code(), text};
  };
  Keep(make, false);
}

void CallLog::Failed(const Error& error) noexcept {
  Keep([&] { return FailedCall{{}, {}, error.Code(), error.what()}; }, false);
}

void CallLog::Refused(const std::string& text) noexcept {
  // A call that failed, or gave nothing, says more than the exception that tells of it.
  if (text.empty() || (failure_ && (isResult_ || failure_->text == text))) return;
  Failed(Error(Error::Kind::Invalid, text));
}

void CallLog::Gave(const Call&) noexcept {
  if (isResult_) failure_.reset();
}

void CallLog::Gave(const Call& call, Status status) noexcept {
  Gave(call);
  if (status == Status::ResetRequired) Waits(call.adapter, Effect::Reset);
  if (status == Status::RebootRequired) Waits(call.adapter, Effect::Reboot);
  if (status != Status::NotSupported) return;
  const auto make = [&] {
    const std::string operation(call.operation.Name());
    const Error error(Error::Kind::NotSupported, call.adapter + " does not support " + operation + ".");
    return FailedCall{operation, call.adapter, error.Code(), error.what()};
  };
  Keep(make, true);
}

void CallLog::GaveNothing(const Call& call) noexcept {
  const auto make = [&] {
    const Error error(Error::Kind::NotFound, "The host has no adapter " + Quoted(call.adapter) + ".");
    return FailedCall{std::string(call.operation.Name()), call.adapter, error.Code(), error.what()};
  };
  Keep(make, true);
}

void CallLog::WasReset(const std::string& adapter) noexcept {
  std::erase_if(notes_,
                [&](const Note& note) { return note.what == adapter && note.waitsFor == Effect::Reset; });
  Add(adapter, Effect::Now);
}

void CallLog::Waits(const std::string& what, Effect effect) noexcept { Add(what, effect); }

void CallLog::Add(const std::string& what, Effect effect) noexcept try {
  const Note note{what, effect};
  if (std::find(notes_.begin(), notes_.end(), note) == notes_.end()) notes_.push_back(note);
} catch (const std::bad_alloc&) {
}

std::optional<FailedCall> CallLog::TakeFailure() { return std::exchange(failure_, std::nullopt); }

std::vector<std::string> CallLog::TakeNotes() {
  std::vector<std::string> sentences;
  for (const Note& note : std::exchange(notes_, {}))
    sentences.push_back(SentenceFor(note.what, note.waitsFor));
  return sentences;
}

}  // namespace host

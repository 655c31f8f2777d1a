/// Several changes of an adapter in a row: each is final once it is made, and what they ask for is gathered.
///
/// Reboots become the text of the result. A reset is done once behind the last change, and also when the row
/// ends early, so that the changes made by then take effect.
#pragma once

#include <sstream>
#include <string>

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

class ChangeSequence;

/// The changes of a row; false where it refuses to go on.
using ChangeRow = bool (*)(const Plinth::CallSpec::Input& input, iScsiInterface& adapter,
                           ChangeSequence& sequence);

class ChangeSequence {
 public:
  using Status = iScsiInterface::iScsiStatus;

  ChangeSequence(iScsiInterface& adapter, const OutputPtr& output) : adapter_(adapter), output_(output) {}

  /// Notes what the change that gave @p status asks for. @p option names it to the user and may be empty.
  void Note(const std::string& option, Status status) {
    if (IscsiTools::IsResetRequired(option, status, reboots_)) resetRequired_ = true;
  }
  /// The same, until a reset is to be done: then nothing more is noted.
  void NoteUntilReset(Status status) {
    if (!resetRequired_) Note("", status);
  }
  /// Tells the user why the row ends here. Gives false, for a row to return.
  bool Refuse(const std::string& text) {
    output_->ReportError(text);
    return false;
  }

 private:
  friend void ChangeInSequence(const InputPtr&, const OutputPtr&, const char*, ChangeRow);

  void Reset() {
    if (resetRequired_) adapter_.ResetAdapter();
  }

  iScsiInterface& adapter_;
  const OutputPtr& output_;
  std::stringstream reboots_;
  bool resetRequired_ = false;  // stays set behind the reset: a reset that failed is tried again
};

/// Runs @p changes on the adapter that the user named. @p failureText stands in front of the library's reason
/// where the library fails. Only a whole row has a result.
inline void ChangeInSequence(const InputPtr& input, const OutputPtr& output, const char* failureText,
                             ChangeRow changes) {
  const std::unique_ptr<iScsiInterface> adapter = FindAdapter(input, output);
  if (!adapter) return;
  ChangeSequence sequence(*adapter, output);
  const bool succeeded = Guarded(output, {failureText, FailureReport::Reason::Last}, [&] {
    const bool whole = changes(*input, *adapter, sequence);
    sequence.Reset();
    if (whole) PostText(output, sequence.reboots_.str());
  });
  if (succeeded) return;
  try {
    sequence.Reset();
  } catch (const NodeCtl::Lib::NodeCtlException& failure) {
    output->ReportError(failure.GetDescription(0));
  }
}

/// What is declared of a command that makes such a row.
constexpr Declaration ChangeDeclaration(const char* description, std::span<const Parameter> parameters) {
  return {.description = description,
          .type = kOperation,
          .formatter = "simple",
          .parameters = parameters,
          .result = Text("Status")};
}

/// A command that makes the row Derived::kRow, and reports Derived::kFailureText where the library fails.
template <class Derived>
class ChangeCommand : public CommandFrame<Derived> {
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ChangeInSequence(input, output, Derived::kFailureText, Derived::kRow);
  }
};

}  // namespace TessaroCli::IscsiNamespace

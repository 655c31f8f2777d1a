/// Several changes of an adapter in a row: each is final once it is made, and what they ask for is gathered.
///
/// Reboots become the text of the result. A reset is done once behind the last change, and also when the row
/// ends early, so that the changes made by then take effect.
#pragma once

#include <sstream>
#include <string>

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

class ChangeSequence {
 public:
  using Status = iScsiInterface::iScsiStatus;
  /// The changes of a row; false where it refuses to go on.
  using Row = bool (*)(const Plinth::CallSpec::Input& input, iScsiInterface& adapter,
                       ChangeSequence& sequence);

  ChangeSequence(iScsiInterface& adapter, const OutputPtr& output) : adapter_(adapter), output_(output) {}

  /// Makes the changes of @p row and ends it. @p failureText stands in front of the library's reason where
  /// the library fails. Only a whole row has a result.
  void Run(Row row, const Plinth::CallSpec::Input& input, const char* failureText);

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
  void ResetIfRequired() {
    if (resetRequired_) adapter_.ResetAdapter();
  }

  iScsiInterface& adapter_;
  const OutputPtr& output_;
  std::stringstream reboots_;
  bool resetRequired_ = false;  // for good: where the reset is what fails, it is tried once more
};

/// What is declared of a command that makes such a row.
constexpr Declaration ChangeDeclaration(const char* description, std::span<const Option> options) {
  return {.description = description,
          .type = kOperation,
          .formatter = "simple",
          .options = options,
          .result = TextResult("Status")};
}

/// A command that makes the row Derived::kRow, and reports Derived::kFailureText where the library fails.
template <class Derived>
class ChangeCommand : public CommandFrame<Derived> {
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    const auto adapter = FindAdapter(input, output);
    if (adapter) ChangeSequence(*adapter, output).Run(Derived::kRow, *input, Derived::kFailureText);
  }
};

}  // namespace TessaroCli::IscsiNamespace

/// The shape that all commands share.
///
/// A command is one source file: its declaration as constant data, and its steps.
///
///     class AdapterSet : public CommandFrame<AdapterSet> {
///      public:
///       static constexpr Declaration kDeclaration{...};
///
///      private:
///       void ExecuteInternal(InputPtr input, OutputPtr output) override { ... }
///     };
///
///     template NodePtr Make<AdapterSet>();
///
/// and a line in the tree (Registration.cpp).
#pragma once

#include <CoreCtl/Storage.h>
#include <Plinth/AutoCli.h>

#include <memory>

#include "Declaration.h"
#include "IscsiUtil/IscsiTools.h"
#include "Messages.h"
#include "Registration.h"

namespace TessaroCli::IscsiNamespace {

using IscsiUtil::IscsiTools;
using NodeCtl::Storage::iScsiInterface;

// The two names of the operation by which a class whose result is a list tells what its elements are.

template <class CommandClass>
concept HasListType = requires(CommandClass& command) {
  command.GetListType();
};
template <class CommandClass>
concept HasOutputStructure = requires(CommandClass& command) {
  command.GetOutputStructure();
};

/// Derives the specs and the help of @p Derived from its kDeclaration. Holds nothing between runs.
template <class Derived>
class CommandFrame : public virtual Plinth::AutoCli::Command {
 public:
  static boost::shared_ptr<Derived> New() {
    static_assert((Derived::kDeclaration.result.kind == ResultKind::List) ==
                  (HasListType<Derived> || HasOutputStructure<Derived>));
    return boost::shared_ptr<Derived>(new Derived());
  }

 protected:
  CommandFrame() {
    const Declaration& declaration = Derived::kDeclaration;
    SetDescription(declaration.description);
    if (declaration.formatter != nullptr) SetDefaultOutputFormatter(declaration.formatter);
    for (const auto& setting : declaration.formatterSettings) {
      if (setting) SetDefaultOutputParameter(setting->key, TextOf(*setting));
    }
    if (declaration.type != nullptr) SetMetaDataField("type", declaration.type);
  }

  InputSpecPtr GetInputSpecInternal() override { return MakeInputSpec(Derived::kDeclaration); }
  OutputSpecPtr GetOutputSpecInternal() override {
    return MakeOutputSpec(Derived::kDeclaration.result, NewElement());
  }

 private:
  /// The structure of the elements of a list; null for other results.
  StructPtr NewElement() {
    auto& command = static_cast<Derived&>(*this);
    if constexpr (HasListType<Derived>) {
      return command.GetListType();
    } else if constexpr (HasOutputStructure<Derived>) {
      return command.GetOutputStructure();
    } else {
      return nullptr;
    }
  }
};

template <class CommandClass>
NodePtr Make() {
  return CommandClass::New();
}

/// What a command reports of a library failure: a text of its own, with or without the library's reason.
struct FailureReport {
  enum class Reason { Hidden, First, Last };

  const char* text;
  Reason reason = Reason::Hidden;
};

constexpr FailureReport Reporting(const char* text) { return {text, FailureReport::Reason::Hidden}; }
constexpr FailureReport ReportingReasonThen(const char* text) { return {text, FailureReport::Reason::First}; }
constexpr FailureReport ReportingThenReason(const char* text) { return {text, FailureReport::Reason::Last}; }

/// Tells the user of @p failure.
void Report(const OutputPtr& output, const FailureReport& report,
            const NodeCtl::Lib::NodeCtlException& failure);

/// Runs @p steps; a NodeCtlException ends them and is reported.
template <class Steps>
void Guarded(const OutputPtr& output, const FailureReport& report, Steps&& steps) {
  try {
    steps();
  } catch (const NodeCtl::Lib::NodeCtlException& failure) {
    Report(output, report, failure);
  }
}

/// The adapter that the user named. Null when it cannot be had, for whatever reason: that is then reported as
/// an unknown adapter.
std::unique_ptr<iScsiInterface> FindAdapter(const InputPtr& input, const OutputPtr& output);

/// Looks the adapter up, and runs @p steps on it as Guarded does. The adapter object lives that long.
template <class Steps>
void WithAdapter(const InputPtr& input, const OutputPtr& output, const FailureReport& report, Steps&& steps) {
  const std::unique_ptr<iScsiInterface> adapter = FindAdapter(input, output);
  if (adapter) Guarded(output, report, [&] { steps(*adapter); });
}

/// Posts @p result as the result of the run and ends the output.
void Post(const OutputPtr& output, const boost::shared_ptr<Plinth::MetaObj::MetaObject>& result);
void PostSuccess(const OutputPtr& output);
void PostText(const OutputPtr& output, const std::string& text);

}  // namespace TessaroCli::IscsiNamespace

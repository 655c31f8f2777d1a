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

/// Derives the specs and the help of @p Derived from its kDeclaration. Holds nothing between runs.
template <class Derived>
class CommandFrame : public virtual Plinth::AutoCli::Command {
 public:
  static boost::shared_ptr<Derived> New() { return boost::shared_ptr<Derived>(new Derived()); }

 protected:
  CommandFrame() {
    const Declaration& declaration = Derived::kDeclaration;
    SetDescription(declaration.description);
    if (declaration.formatter != nullptr) SetDefaultOutputFormatter(declaration.formatter);
    for (const FormatterParameter& setting : declaration.formatterParameters) {
      if (setting.key != nullptr) SetDefaultOutputParameter(setting.key, SettingText(setting, declaration));
    }
    if (declaration.type != nullptr) SetMetaDataField("type", declaration.type);
  }

  InputSpecPtr GetInputSpecInternal() override { return MakeInputSpec(Derived::kDeclaration); }
  OutputSpecPtr GetOutputSpecInternal() override { return MakeOutputSpec(Derived::kDeclaration); }
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

  void operator()(Plinth::CallSpec::Output& output, const NodeCtl::Lib::NodeCtlException& failure) const;
};

/// Runs @p body and reports a NodeCtlException from it. False after a failure.
template <class Body>
bool Guarded(const OutputPtr& output, const FailureReport& report, Body&& body) {
  try {
    body();
    return true;
  } catch (const NodeCtl::Lib::NodeCtlException& failure) {
    report(*output, failure);
    return false;
  }
}

/// The adapter that the user named. Null when there is none, which is then reported.
std::unique_ptr<iScsiInterface> FindAdapter(const InputPtr& input, const OutputPtr& output);

/// Looks the adapter up, and runs @p body on it with library failures reported. The adapter object lives that
/// long.
template <class Body>
void WithAdapter(const InputPtr& input, const OutputPtr& output, const FailureReport& report, Body&& body) {
  const std::unique_ptr<iScsiInterface> adapter = FindAdapter(input, output);
  if (adapter) Guarded(output, report, [&] { body(*adapter); });
}

/// Posts @p result as the result of the run and ends the output.
void Post(const OutputPtr& output, const boost::shared_ptr<Plinth::MetaObj::MetaObject>& result);
void PostSuccess(const OutputPtr& output);
void PostText(const OutputPtr& output, const std::string& text);

}  // namespace TessaroCli::IscsiNamespace

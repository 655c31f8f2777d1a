#include "Declaration.h"

namespace TessaroCli::IscsiNamespace {

using Plinth::CallSpec::InputSpec;
using Plinth::CallSpec::OutputSpec;
using Plinth::CallSpec::ParameterConstraint;
using Plinth::CallSpec::ParameterConstraintType;
using Plinth::CallSpec::ParameterSpec;
using Plinth::MetaObj::MetaBool;
using Plinth::MetaObj::MetaString;

InputSpecPtr MakeInputSpec(const Declaration& declaration) {
  InputSpecPtr spec = InputSpec::New();
  for (const Option& option : declaration.options) {
    const auto parameterSpec = ParameterSpec::New(option.name, option.type);
    parameterSpec->SetShortName(std::string(1, option.letter));
    parameterSpec->SetHelp(option.help);
    if (!option.values.empty()) {
      const auto constraint = ParameterConstraint::New(ParameterConstraintType::StringEnum);
      for (const char* value : option.values) constraint->AddStringEnum(value, "");
      parameterSpec->SetConstraint(constraint);
    }
    parameterSpec->SetRequired(option.required);
    if (option.sensitive) parameterSpec->SetSensitive(true);
    spec->AddParameter(parameterSpec);
  }
  return spec;
}

OutputSpecPtr MakeOutputSpec(const Result& result, const StructPtr& element) {
  OutputSpecPtr spec = OutputSpec::New();
  switch (result.kind) {
    case ResultKind::Success:
      spec->SetResultType(MetaBool::New());
      break;
    case ResultKind::Text:
      spec->SetResultType(MetaString::New(result.sample));
      break;
    case ResultKind::Structure:
      spec->SetResultType(NewPrototype(*result.structure));
      break;
    case ResultKind::List: {
      const ListPtr list = NewList(element);
      if (result.hasSample) list->Append(element);
      spec->SetResultType(list);
      break;
    }
  }
  return spec;
}

std::string TextOf(const FormatterSetting& setting) {
  if (const auto* text = std::get_if<const char*>(&setting.value)) return *text;
  const auto& [structure, first] = std::get<FieldNames>(setting.value);
  std::string names;
  for (const Field& field : structure->fields.subspan(first)) {
    if (!names.empty()) names += ',';
    names += field.name;
  }
  return names;
}

}  // namespace TessaroCli::IscsiNamespace

#include "Declaration.h"

namespace TessaroCli::IscsiNamespace {

using Plinth::CallSpec::InputSpec;
using Plinth::CallSpec::OutputSpec;
using Plinth::CallSpec::ParameterConstraint;
using Plinth::CallSpec::ParameterConstraintType;
using Plinth::CallSpec::ParameterSpec;
using Plinth::MetaObj::MetaBool;
using Plinth::MetaObj::MetaInt;
using Plinth::MetaObj::MetaList;
using Plinth::MetaObj::MetaString;
using Plinth::MetaObj::MetaStruct;

InputSpecPtr MakeInputSpec(const Declaration& declaration) {
  InputSpecPtr spec = InputSpec::New();
  for (const Parameter& parameter : declaration.parameters) {
    const auto parameterSpec = ParameterSpec::New(parameter.name, parameter.type);
    parameterSpec->SetShortName(std::string(1, parameter.letter));
    parameterSpec->SetHelp(parameter.help);
    if (!parameter.values.empty()) {
      const auto constraint = ParameterConstraint::New(ParameterConstraintType::StringEnum);
      for (const char* value : parameter.values) constraint->AddStringEnum(value, "");
      parameterSpec->SetConstraint(constraint);
    }
    parameterSpec->SetRequired(parameter.required);
    if (parameter.sensitive) parameterSpec->SetSensitive(true);
    spec->AddParameter(parameterSpec);
  }
  return spec;
}

OutputSpecPtr MakeOutputSpec(const Declaration& declaration) {
  const Result& result = declaration.result;
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
      const StructPtr prototype = NewPrototype(*result.structure);
      const ListPtr list = MetaList::New(MetaType::Struct, prototype);
      if (result.hasSample) list->Append(prototype);
      spec->SetResultType(list);
      break;
    }
  }
  return spec;
}

std::string SettingText(const FormatterParameter& setting, const Declaration& declaration) {
  if (setting.value != nullptr) return setting.value;
  std::string names;
  for (const Field& field : declaration.result.structure->fields.subspan(setting.firstField)) {
    if (!names.empty()) names += ',';
    names += field.name;
  }
  return names;
}

StructPtr NewPrototype(const Structure& structure) {
  StructPtr prototype = MetaStruct::New(structure.name);
  for (const Field& field : structure.fields) {
    switch (field.type) {
      case MetaType::Bool:
        prototype->SetField(field.name, MetaBool::New());
        break;
      case MetaType::Int:
        prototype->SetField(field.name, MetaInt::New());
        break;
      default:
        prototype->SetField(field.name, MetaString::New());
        break;
    }
  }
  return prototype;
}

ListPtr NewList(const Structure& structure) {
  return MetaList::New(MetaType::Struct, NewPrototype(structure));
}

}  // namespace TessaroCli::IscsiNamespace

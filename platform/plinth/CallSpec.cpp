#include <Plinth/CallSpec.h>

#include <stdexcept>
#include <utility>

#include "plinth/Declarations.h"

namespace Plinth::CallSpec {

ParameterConstraint::~ParameterConstraint() = default;
ParameterSpec::~ParameterSpec() = default;
InputSpec::~InputSpec() = default;
OutputSpec::~OutputSpec() = default;
Input::~Input() = default;
Output::~Output() = default;

namespace {

/// A plug-in can derive from a specification, but what it declares is in ours alone.
template <class OwnClass, class Spec>
const OwnClass& Own(const Spec& spec, const char* name) {
  const auto* const own = dynamic_cast<const OwnClass*>(&spec);
  if (!own) throw std::logic_error(std::string("a command's ") + name + " was not made by its New()");
  return *own;
}

class EnumConstraint final : public ParameterConstraint {
 public:
  void AddStringEnum(const std::string& value, const std::string& help) override {
    values.push_back({value, help});
  }

  std::vector<AllowedValue> values;
};

class DeclaredParameter final : public ParameterSpec {
 public:
  DeclaredParameter(const std::string& name, ParameterType type) {
    parameter_.name = name;
    parameter_.type = type;
  }

  void SetShortName(const std::string& letter) override { parameter_.shortName = letter; }
  void SetHelp(const std::string& text) override { parameter_.help = text; }
  void SetConstraint(boost::shared_ptr<ParameterConstraint> constraint) override {
    constraint_ = std::move(constraint);
  }
  void SetRequired(bool required) override { parameter_.required = required; }
  void SetSensitive(bool sensitive) override { parameter_.sensitive = sensitive; }

  /// Values may be added to the constraint at any time, so they are read last.
  Parameter Read() const {
    Parameter parameter = parameter_;
    if (constraint_) parameter.allowed = Own<EnumConstraint>(*constraint_, "ParameterConstraint").values;
    return parameter;
  }

 private:
  Parameter parameter_;
  boost::shared_ptr<ParameterConstraint> constraint_;
};

class DeclaredInput final : public InputSpec {
 public:
  void AddParameter(boost::shared_ptr<ParameterSpec> parameter) override {
    if (!parameter) throw std::logic_error("no parameter is given to add");
    parameters.push_back(std::move(parameter));
  }

  std::vector<boost::shared_ptr<ParameterSpec>> parameters;
};

class DeclaredOutput final : public OutputSpec {
 public:
  void SetResultType(boost::shared_ptr<MetaObj::MetaObject> given) override { prototype = std::move(given); }

  boost::shared_ptr<MetaObj::MetaObject> prototype;
};

}  // namespace

boost::shared_ptr<ParameterConstraint> ParameterConstraint::New(ParameterConstraintType type) {
  if (type != ParameterConstraintType::StringEnum) throw std::logic_error("unknown type of constraint");
  return boost::shared_ptr<ParameterConstraint>(new EnumConstraint);
}

boost::shared_ptr<ParameterSpec> ParameterSpec::New(const std::string& name, ParameterType type) {
  return boost::shared_ptr<ParameterSpec>(new DeclaredParameter(name, type));
}

boost::shared_ptr<InputSpec> InputSpec::New() { return boost::shared_ptr<InputSpec>(new DeclaredInput); }

boost::shared_ptr<OutputSpec> OutputSpec::New() { return boost::shared_ptr<OutputSpec>(new DeclaredOutput); }

}  // namespace Plinth::CallSpec

namespace Plinth {

const std::string* FindValue(const KeyValues& settings, const std::string& key) {
  for (const auto& setting : settings) {
    if (setting.first == key) return &setting.second;
  }
  return nullptr;
}

std::vector<std::string> AllowedValues(const Parameter& parameter) {
  std::vector<std::string> values;
  for (const AllowedValue& allowed : parameter.allowed) values.push_back(allowed.value);
  return values;
}

bool MayBeOperand(const Parameter& parameter) {
  return parameter.required && parameter.shortName.empty() && parameter.type != CallSpec::ParameterType::Flag;
}

std::vector<Parameter> ParametersOf(const CallSpec::InputSpec& spec) {
  std::vector<Parameter> parameters;
  for (const auto& parameter : CallSpec::Own<CallSpec::DeclaredInput>(spec, "InputSpec").parameters) {
    parameters.push_back(CallSpec::Own<CallSpec::DeclaredParameter>(*parameter, "ParameterSpec").Read());
  }
  return parameters;
}

boost::shared_ptr<MetaObj::MetaObject> PrototypeOf(const CallSpec::OutputSpec& spec) {
  return CallSpec::Own<CallSpec::DeclaredOutput>(spec, "OutputSpec").prototype;
}

const MetaObj::MetaStruct* StructureOf(const MetaObj::MetaObject& object) {
  if (object.GetType() == MetaObj::MetaType::Struct) return static_cast<const MetaObj::MetaStruct*>(&object);
  if (object.GetType() != MetaObj::MetaType::List) return nullptr;
  const auto& list = static_cast<const MetaObj::MetaList&>(object);
  const MetaObj::MetaObject* element = list.GetPrototype().get();
  // A prototype without fields leaves it to the elements to say what they are.
  const auto* structure = dynamic_cast<const MetaObj::MetaStruct*>(element);
  if ((!structure || structure->GetFieldCount() == 0) && list.GetSize() > 0) {
    element = list.GetElement(0).get();
  }
  return dynamic_cast<const MetaObj::MetaStruct*>(element);
}

std::vector<std::string> FieldNames(const MetaObj::MetaStruct& structure) {
  std::vector<std::string> names;
  for (std::size_t index = 0; index < structure.GetFieldCount(); ++index) {
    names.push_back(structure.GetFieldName(index));
  }
  return names;
}

const char* TypeName(CallSpec::ParameterType type) {
  switch (type) {
    case CallSpec::ParameterType::String:
      return "string";
    case CallSpec::ParameterType::Int:
      return "int";
    case CallSpec::ParameterType::Bool:
      return "bool";
    case CallSpec::ParameterType::Flag:
      return "flag";
    case CallSpec::ParameterType::StringList:
      return "list";
  }
  return "unknown";
}

const char* TypeName(MetaObj::MetaType type) {
  switch (type) {
    case MetaObj::MetaType::Bool:
      return "bool";
    case MetaObj::MetaType::Int:
      return "int";
    case MetaObj::MetaType::String:
      return "string";
    case MetaObj::MetaType::Struct:
      return "struct";
    case MetaObj::MetaType::List:
      return "list";
  }
  return "unknown";
}

}  // namespace Plinth

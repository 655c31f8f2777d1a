/// What a command says of itself, as constant data: its help, its parameters and its result, each written
/// once.
///
/// A command's file lists its parameters one a line:
///
///     constexpr Parameter kParameters[] = {
///         Adapter(),
///         String("name", 'n', "The iSCSI initiator name."),
///     };
///
/// and, where it shows structures, a column a line: the field's name and where its value comes from. The type
/// of the field follows from the value, so that declaration and rows cannot differ.
#pragma once

#include <Plinth/CallSpec.h>
#include <Plinth/MetaObj.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <type_traits>

namespace TessaroCli::IscsiNamespace {

using InputPtr = boost::shared_ptr<Plinth::CallSpec::Input>;
using OutputPtr = boost::shared_ptr<Plinth::CallSpec::Output>;
using InputSpecPtr = boost::shared_ptr<Plinth::CallSpec::InputSpec>;
using OutputSpecPtr = boost::shared_ptr<Plinth::CallSpec::OutputSpec>;
using StructPtr = boost::shared_ptr<Plinth::MetaObj::MetaStruct>;
using ListPtr = boost::shared_ptr<Plinth::MetaObj::MetaList>;
using Plinth::CallSpec::ParameterType;
using Plinth::MetaObj::MetaType;

// Parameters

struct Parameter {
  const char* name;
  char letter;
  ParameterType type;
  const char* help;
  bool required = false;
  bool sensitive = false;
  std::span<const char* const> values = {};  ///< the only values allowed; none for any

  constexpr Parameter Required() const {
    Parameter changed = *this;
    changed.required = true;
    return changed;
  }
  constexpr Parameter Sensitive() const {
    Parameter changed = *this;
    changed.sensitive = true;
    return changed;
  }
  /// @p allowed outlives the declaration.
  constexpr Parameter OneOf(std::span<const char* const> allowed) const {
    Parameter changed = *this;
    changed.values = allowed;
    return changed;
  }
};

constexpr Parameter String(const char* name, char letter, const char* help) {
  return {name, letter, ParameterType::String, help};
}
constexpr Parameter Integer(const char* name, char letter, const char* help) {
  return {name, letter, ParameterType::Int, help};
}
constexpr Parameter Boolean(const char* name, char letter, const char* help) {
  return {name, letter, ParameterType::Bool, help};
}
constexpr Parameter Flag(const char* name, char letter, const char* help) {
  return {name, letter, ParameterType::Flag, help};
}
constexpr Parameter StringList(const char* name, char letter, const char* help) {
  return {name, letter, ParameterType::StringList, help};
}
/// The adapter that a listing may be limited to.
constexpr Parameter AdapterFilter() { return String("adapter", 'A', "The iSCSI adapter name."); }
/// The target that a listing may be limited to.
constexpr Parameter TargetFilter() { return String("name", 'n', "The iSCSI target name."); }
/// The adapter that a command works on.
constexpr Parameter Adapter() { return AdapterFilter().Required(); }

// Results

struct Field {
  const char* name = nullptr;
  MetaType type = MetaType::String;
};

struct Structure {
  const char* name;
  std::span<const Field> fields;
};

/// A field of a row made from a Source, and how to get its value.
template <class Source>
struct Column {
  Field field;
  void (*set)(Plinth::MetaObj::MetaStruct& row, const char* name, const Source& source);

  /// @p Get is a lambda without captures that takes the source and yields a bool, an int, a long long or a
  /// text.
  template <class Get>
  constexpr Column(const char* name, Get)
      : field{name, TypeOf<std::invoke_result_t<Get, const Source&>>()},
        set([](Plinth::MetaObj::MetaStruct& row, const char* fieldName, const Source& source) {
          row.SetField(fieldName, Get{}(source));
        }) {}

 private:
  template <class Value>
  static constexpr MetaType TypeOf() {
    if constexpr (std::is_same_v<Value, bool>) return MetaType::Bool;
    if constexpr (std::is_integral_v<Value>) return MetaType::Int;
    return MetaType::String;
  }
};

/// The fields of an array of columns.
template <const auto& columns>
inline constexpr auto kFieldsOf = [] {
  std::array<Field, std::size(columns)> fields;
  for (std::size_t i = 0; i < fields.size(); ++i) fields[i] = columns[i].field;
  return fields;
}();

/// The structure @p name with a field for each of the @p columns.
template <const auto& columns>
constexpr Structure StructureOf(const char* name) {
  return {name, kFieldsOf<columns>};
}

enum class ResultKind { Success, Text, Structure, List };

struct Result {
  ResultKind kind;
  const char* sample = "";               ///< a word for a text result
  const Structure* structure = nullptr;  ///< of the structure, or of the elements of the list
  bool hasSample = false;                ///< the declared list holds a prototype as an example
};

constexpr Result Success() { return {ResultKind::Success}; }
constexpr Result Text(const char* sample) { return {ResultKind::Text, sample}; }
constexpr Result One(const Structure& structure) { return {ResultKind::Structure, "", &structure}; }
constexpr Result ListOf(const Structure& structure) { return {ResultKind::List, "", &structure, true}; }
constexpr Result BareListOf(const Structure& structure) { return {ResultKind::List, "", &structure}; }

// Commands

/// A setting of the default formatter.
struct FormatterParameter {
  const char* key;
  const char* value;       ///< null for the names of all fields from firstField on
  std::size_t firstField;  ///< counts from 0
};

constexpr FormatterParameter Setting(const char* key, const char* value) { return {key, value, 0}; }
/// All fields of the result from number @p firstField on, in order.
constexpr FormatterParameter FieldsFrom(std::size_t firstField, const char* key) {
  return {key, nullptr, firstField};
}

struct Declaration {
  const char* description;
  const char* type = nullptr;       ///< "fetcher" reads, "operation" changes; null says nothing
  const char* formatter = nullptr;  ///< null for the framework's own choice
  std::array<FormatterParameter, 2> formatterParameters = {};
  std::span<const Parameter> parameters = {};
  Result result;
};

inline constexpr char kFetcher[] = "fetcher";
inline constexpr char kOperation[] = "operation";

// What the framework is told, made from the declaration.

InputSpecPtr MakeInputSpec(const Declaration& declaration);
OutputSpecPtr MakeOutputSpec(const Declaration& declaration);
/// The value of a formatter setting.
std::string SettingText(const FormatterParameter& setting, const Declaration& declaration);
/// A fresh structure with a field of each type and no values.
StructPtr NewPrototype(const Structure& structure);
/// A fresh empty list of such structures.
ListPtr NewList(const Structure& structure);

/// A row with all its fields set from @p source, in the order of the columns.
template <class Source, std::size_t count>
StructPtr NewRow(const Structure& structure, const Column<Source> (&columns)[count], const Source& source) {
  StructPtr row = Plinth::MetaObj::MetaStruct::New(structure.name);
  for (const Column<Source>& column : columns) column.set(*row, column.field.name, source);
  return row;
}

}  // namespace TessaroCli::IscsiNamespace

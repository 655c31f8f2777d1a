/// What a command says of itself, as constant data: its help, its options and its result, each written
/// once.
///
/// A command's file lists its options one a line:
///
///     constexpr Option kOptions[] = {
///         AdapterOption(),
///         StringOption("name", 'n', "The iSCSI initiator name."),
///     };
///
/// and, where it shows structures, their columns (Rows.h).
#pragma once

#include <Plinth/CallSpec.h>

#include <array>
#include <cstddef>
#include <optional>
#include <span>
#include <string>
#include <variant>

#include "Rows.h"

namespace TessaroCli::IscsiNamespace {

using InputPtr = boost::shared_ptr<Plinth::CallSpec::Input>;
using OutputPtr = boost::shared_ptr<Plinth::CallSpec::Output>;
using InputSpecPtr = boost::shared_ptr<Plinth::CallSpec::InputSpec>;
using OutputSpecPtr = boost::shared_ptr<Plinth::CallSpec::OutputSpec>;
using Plinth::CallSpec::ParameterType;

// Options

struct Option {
  const char* name;
  char letter;
  ParameterType type;
  const char* help;
  bool required = false;
  bool sensitive = false;
  std::span<const char* const> values = {};  ///< the only values allowed; none for any

  constexpr Option Required() const {
    Option changed = *this;
    changed.required = true;
    return changed;
  }
  constexpr Option Sensitive() const {
    Option changed = *this;
    changed.sensitive = true;
    return changed;
  }
  /// @p allowed outlives the declaration.
  constexpr Option OneOf(std::span<const char* const> allowed) const {
    Option changed = *this;
    changed.values = allowed;
    return changed;
  }
};

constexpr Option StringOption(const char* name, char letter, const char* help) {
  return {name, letter, ParameterType::String, help};
}
constexpr Option IntegerOption(const char* name, char letter, const char* help) {
  return {name, letter, ParameterType::Int, help};
}
constexpr Option BooleanOption(const char* name, char letter, const char* help) {
  return {name, letter, ParameterType::Bool, help};
}
constexpr Option FlagOption(const char* name, char letter, const char* help) {
  return {name, letter, ParameterType::Flag, help};
}
constexpr Option StringListOption(const char* name, char letter, const char* help) {
  return {name, letter, ParameterType::StringList, help};
}
/// The adapter that a listing may be limited to.
constexpr Option AdapterFilter() { return StringOption("adapter", 'A', "The iSCSI adapter name."); }
/// The target that a listing may be limited to.
constexpr Option TargetFilter() { return StringOption("name", 'n', "The iSCSI target name."); }
/// The adapter that a command works on.
constexpr Option AdapterOption() { return AdapterFilter().Required(); }

// Results

enum class ResultKind { Success, Text, Structure, List };

/// What a command posts. The elements of a list are such as the class tells by its operation GetListType or
/// GetOutputStructure.
struct Result {
  ResultKind kind;
  const char* sample = "";               ///< a word for a text result
  const Structure* structure = nullptr;  ///< of the one structure
  bool hasSample = false;                ///< the declared list holds a prototype as an example
};

constexpr Result SuccessResult() { return {.kind = ResultKind::Success}; }
constexpr Result TextResult(const char* sample) { return {.kind = ResultKind::Text, .sample = sample}; }
constexpr Result StructureResult(const Structure& structure) {
  return {.kind = ResultKind::Structure, .structure = &structure};
}
constexpr Result ListResult() { return {.kind = ResultKind::List, .hasSample = true}; }
/// A list that is declared without an example.
constexpr Result BareListResult() { return {.kind = ResultKind::List}; }

// Commands

/// The names of all fields of a structure from number `first` on, with commas between.
struct FieldNames {
  const Structure* structure;
  std::size_t first;  ///< counts from 0
};

/// A setting of the default formatter.
struct FormatterSetting {
  const char* key;
  std::variant<const char*, FieldNames> value;
};

constexpr FormatterSetting Setting(const char* key, const char* value) { return {key, value}; }
/// The fields of @p structure from number @p first on, in order.
constexpr FormatterSetting FieldsFrom(std::size_t first, const Structure& structure, const char* key) {
  return {key, FieldNames{&structure, first}};
}

struct Declaration {
  const char* description;
  const char* type = nullptr;       ///< "fetcher" reads, "operation" changes; null says nothing
  const char* formatter = nullptr;  ///< null for the framework's own choice
  std::array<std::optional<FormatterSetting>, 2> formatterSettings = {};
  std::span<const Option> options = {};
  Result result;
};

inline constexpr char kFetcher[] = "fetcher";
inline constexpr char kOperation[] = "operation";

// What the framework is told, made from the declaration.

InputSpecPtr MakeInputSpec(const Declaration& declaration);
/// @p element is the structure of a list's elements; of no matter for other results.
OutputSpecPtr MakeOutputSpec(const Result& result, const StructPtr& element);
/// The value of a formatter setting.
std::string TextOf(const FormatterSetting& setting);

}  // namespace TessaroCli::IscsiNamespace

/// The structures that commands show, as lists of columns: the name of a field and where its value comes
/// from. The type of the field follows from the value, so that declared fields and rows cannot differ.
///
///     constexpr Column<Portal> kColumns[] = {
///         {"Hostnic", [](const Portal& portal) { return portal.name; }},
///     };
///     constexpr auto kPortal = StructureOf<kColumns>("NetworkPortal");
///
///     list->Append(NewRow(kPortal, {...}));
#pragma once

#include <Plinth/MetaObj.h>

#include <array>
#include <cstddef>
#include <functional>
#include <span>
#include <string>
#include <type_traits>
#include <vector>

namespace TessaroCli {

using StructPtr = boost::shared_ptr<Plinth::MetaObj::MetaStruct>;
using ListPtr = boost::shared_ptr<Plinth::MetaObj::MetaList>;
using Plinth::MetaObj::MetaType;

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
  using RowSource = Source;

  Field field;
  void (*set)(Plinth::MetaObj::MetaStruct& row, const std::string& name, const Source& source);

  /// @p Get is a lambda without captures that takes the source and yields a bool, a number or a text.
  template <class Get>
  constexpr Column(const char* name, Get)
      : field{name, TypeOf<std::invoke_result_t<Get, const Source&>>()},
        set([](Plinth::MetaObj::MetaStruct& row, const std::string& fieldName, const Source& source) {
          using Value = std::invoke_result_t<Get, const Source&>;
          if constexpr (TypeOf<Value>() == MetaType::Int) {
            row.SetField(fieldName, static_cast<long long>(Get{}(source)));
          } else {
            row.SetField(fieldName, Get{}(source));
          }
        }) {}

 private:
  template <class Value>
  static constexpr MetaType TypeOf() {
    if constexpr (std::is_same_v<Value, bool>) return MetaType::Bool;
    if constexpr (std::is_integral_v<Value>) return MetaType::Int;
    return MetaType::String;
  }
};

/// What most columns show of a source: a member of its record `properties`, or what an operation of it gives.
template <auto member>
inline constexpr auto Property = [](const auto& source) { return std::invoke(member, source.properties); };
/// The same for a number that stands for a truth value.
template <auto member>
inline constexpr auto IsSet = [](const auto& source) { return std::invoke(member, source.properties) != 0; };

/// The fields of an array of columns.
template <const auto& columns>
inline constexpr auto kFieldsOf = [] {
  std::array<Field, std::size(columns)> fields;
  for (std::size_t i = 0; i < fields.size(); ++i) fields[i] = columns[i].field;
  return fields;
}();

/// The names of @p fields as rows take them, made once for all rows.
std::vector<std::string> NamesOf(std::span<const Field> fields);

/// A structure, and the columns that make rows of it from a Source.
template <class Source>
struct RowStructure : Structure {
  std::span<const Column<Source>> columns;
  const std::vector<std::string>& (*names)();
};

/// The structure @p name with a field for each of the @p columns.
template <const auto& columns>
constexpr auto StructureOf(const char* name) {
  using Source = typename std::remove_cvref_t<decltype(columns[0])>::RowSource;
  return RowStructure<Source>{{name, kFieldsOf<columns>}, columns, []() -> const std::vector<std::string>& {
                                static const std::vector<std::string> names = NamesOf(kFieldsOf<columns>);
                                return names;
                              }};
}

/// A fresh structure with a field of each type and no values.
StructPtr NewPrototype(const Structure& structure);
/// A fresh empty list of structures such as @p element.
ListPtr NewList(const StructPtr& element);

/// A row with all its fields set from @p source, in the order of the columns.
template <class Source>
StructPtr NewRow(const RowStructure<Source>& structure, const std::type_identity_t<Source>& source) {
  const std::vector<std::string>& names = structure.names();
  StructPtr row = Plinth::MetaObj::MetaStruct::New(structure.name);
  for (std::size_t i = 0; i < names.size(); ++i) structure.columns[i].set(*row, names[i], source);
  return row;
}

}  // namespace TessaroCli

/// How results are shown. One source file a formatter, and its row in the table.
#pragma once

#include <Plinth/MetaObj.h>
#include <Plinth/Reasons.h>

#include <string>
#include <string_view>
#include <vector>

#include "plinth/Console.h"
#include "plinth/Declarations.h"

namespace Plinth {

/// What there is to show, and which part of it.
struct Report {
  /// The exit status.
  int status = 0;
  /// The calls that would have changed something, in a dry run; null where it is none.
  const std::vector<std::string>* calls = nullptr;
  /// The number of the line in a batch; 0 outside of one.
  std::size_t line = 0;
  /// What was reported, and at the end the text of a failure.
  std::vector<std::string> messages;
  std::vector<Reason> reasons;
  std::vector<std::string> notes;
  /// Null where none was posted.
  const MetaObj::MetaObject* result = nullptr;
  /// The fields that the user named; empty where all or the command's default are to be shown.
  std::vector<std::string> fields;
  /// Rows stand below the names of their fields.
  bool hasHeader = true;
  /// Columns of the terminal that tables are to fit; 0 for no limit.
  std::size_t width = 0;
  /// Headings of text forms are bold.
  bool isColored = false;
  /// The command's own settings.
  KeyValues settings;
};

/// Writes the result of @p report, as ShownFields chooses. There is one, unless the form is a document.
using WriteReport = void(const Report& report, Sink& sink);
WriteReport WriteSimple;
WriteReport WriteTable;
WriteReport WriteCsv;
WriteReport WriteJson;
WriteReport WriteYaml;

struct Formatter {
  const char* name;
  WriteReport* write;
  /// One document with status and messages: it is written for failures too, and the command's default fields
  /// do not limit it.
  bool isDocument = false;
};

/// Every formatter there is, in the order that help shows. The first is for whoever names none.
inline constexpr Formatter kFormatters[] = {
    {"simple", WriteSimple},   {"table", WriteTable},     {"csv", WriteCsv},
    {"json", WriteJson, true}, {"yaml", WriteYaml, true},
};

std::vector<std::string> FormatterNames();
/// Null for an unknown name.
const Formatter* FindFormatter(const std::string& name);

/// The fields that a text format shows of a structure: those the user named, else the command's default;
/// empty for all.
std::vector<std::string> ShownFields(const Report& report, const std::string& typeName);
/// One line for any value; empty for null and one without a value. Escaped, so fit for a terminal. Of @p
/// value itself where that needs no change, and otherwise of @p space.
std::string_view ValueText(const MetaObj::MetaObject* value, std::string& space);
/// Calls @p visit with the name of each of @p fields, or of all where that is empty, and with the field, or
/// null where the structure has none of that name.
template <class Visitor>
void ForEachField(const MetaObj::MetaStruct& structure, const std::vector<std::string>& fields,
                  Visitor visit) {
  for (const std::string& name : fields) visit(name, FindField(structure, name));
  for (std::size_t index = 0; fields.empty() && index < structure.GetFieldCount(); ++index) {
    visit(structure.GetFieldName(index), structure.GetField(index).get());
  }
}
/// Calls @p visit for the object, or for each element of a list.
template <class Visitor>
void ForEachElement(const MetaObj::MetaObject& object, Visitor visit) {
  if (object.GetType() != MetaObj::MetaType::List) return visit(object);
  const auto& list = static_cast<const MetaObj::MetaList&>(object);
  for (std::size_t index = 0; index < list.GetSize(); ++index) visit(*list.GetElement(index));
}
/// Writes results that are no structures: a line each. A text keeps its own lines.
void WritePlain(const MetaObj::MetaObject& result, Sink& sink);

}  // namespace Plinth

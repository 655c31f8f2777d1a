/// How results are shown. One source file a formatter, and its row in the table.
#pragma once

#include <Plinth/MetaObj.h>
#include <Plinth/Reasons.h>

#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "plinth/Console.h"
#include "plinth/Declarations.h"
#include "plinth/Structure.h"

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

enum class Form {
  Text,
  /// Records for a program, and nothing beside them.
  Records,
  /// One document with status and messages: it is written for failures too, and the command's default fields
  /// do not limit it.
  Document,
};

struct Formatter {
  const char* name;
  WriteReport* write;
  Form form = Form::Text;
};

/// Every formatter there is, in the order that help shows. The first is for whoever names none.
inline constexpr Formatter kFormatters[] = {
    {"simple", WriteSimple},
    {"table", WriteTable},
    {"csv", WriteCsv, Form::Records},
    {"json", WriteJson, Form::Document},
    {"yaml", WriteYaml, Form::Document},
};

std::vector<std::string> FormatterNames();
/// Null for an unknown name.
const Formatter* FindFormatter(const std::string& name);

/// The fields that a text format shows of a structure: those the user named, else the command's default;
/// empty for all.
std::vector<std::string> ShownFields(const Report& report, const std::string& typeName);
/// One line for any value; empty for one that is not there. Escaped, so fit for a terminal. Of @p value
/// itself where that needs no change, and otherwise of @p space.
std::string_view ValueText(const Value& value, std::string& space);

/// Calls @p visit with the name and the value of each field.
template <class Visitor>
void ForEachField(const MetaObj::MetaStruct& given, Visitor visit) {
  const Structure& structure = Structure::Of(given);
  for (std::size_t index = 0; index < structure.GetFieldCount(); ++index) {
    visit(structure.GetFieldName(index), structure.GetValue(index));
  }
}

/// The fields that are shown of structures, by their names.
class Selection {
 public:
  explicit Selection(std::vector<std::string> names) : names_(std::move(names)) {}

  /// The same with each of them; a value that is not there where @p given has no such field.
  template <class Visitor>
  void ForEachField(const MetaObj::MetaStruct& given, Visitor visit) {
    const Structure& structure = Structure::Of(given);
    FindIn(structure.GetShape());
    for (std::size_t index = 0; index < names_.size(); ++index) {
      visit(names_[index], structure.GetValue(places_[index]));
    }
  }

 private:
  /// Most structures have the shape of those before them.
  void FindIn(const Shape& shape) {
    if (shape_ == &shape) return;
    places_.clear();
    for (const std::string& name : names_) places_.push_back(shape.Find(name));
    shape_ = &shape;
  }

  std::vector<std::string> names_;
  std::vector<std::size_t> places_;
  const Shape* shape_ = nullptr;
};

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

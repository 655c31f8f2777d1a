/// How results are shown. One source file a formatter; FormatterNames and FindFormatter know them all.
#pragma once

#include <Plinth/MetaObj.h>

#include <string>
#include <vector>

#include "plinth/Console.h"
#include "plinth/Declarations.h"

namespace Plinth {

/// What there is to show, and which part of it.
struct Report {
  /// The exit status.
  int status = 0;
  /// What was reported, and at the end the text of a failure.
  std::vector<std::string> messages;
  /// Null where none was posted.
  const MetaObj::MetaObject* result = nullptr;
  /// The fields that the user named; empty where all or the command's default are to be shown.
  std::vector<std::string> fields;
  /// The command's own settings.
  KeyValues settings;
};

class Formatter {
 public:
  Formatter() = default;
  Formatter(const Formatter&) = delete;
  Formatter& operator=(const Formatter&) = delete;
  virtual ~Formatter() = default;

  /// True for a format that is one document with status and messages: it is written for failures too, and
  /// the command's default fields do not limit it.
  virtual bool IsDocument() const { return false; }
  /// @p report has a result, unless this is a document.
  virtual void Write(const Report& report, Sink& sink) const = 0;
};

const Formatter& SimpleFormatter();
const Formatter& TableFormatter();
const Formatter& JsonFormatter();

std::vector<std::string> FormatterNames();
/// Null for an unknown name.
const Formatter* FindFormatter(const std::string& name);

/// The fields that a text format shows: those the user named, else the command's default, else all.
std::vector<std::string> ShownFields(const Report& report, const MetaObj::MetaStruct& structure);
/// One line for any value; empty for one without a value. Escaped, so fit for a terminal.
std::string ValueText(const MetaObj::MetaObject& value);
/// The same for a field, empty where the structure has none of that name.
std::string FieldText(const MetaObj::MetaStruct& structure, const std::string& name);
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

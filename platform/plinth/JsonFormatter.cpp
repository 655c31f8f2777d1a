#include <algorithm>
#include <cstdio>

#include "plinth/Formatter.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using MetaObj::MetaType;

void WriteString(std::string_view text, Sink& sink) {
  const auto standsForItself = [](unsigned char byte) {
    return byte >= ' ' && byte < 0x80 && byte != '"' && byte != '\\';
  };
  sink.Write("\"");
  while (true) {
    const auto end = std::find_if_not(text.begin(), text.end(), standsForItself);
    const auto length = static_cast<std::size_t>(end - text.begin());
    sink.Write(text.substr(0, length));
    text.remove_prefix(length);
    if (text.empty()) break;
    const Character character = DecodeUtf8(text, 0);
    if (!character.valid) {
      sink.Write("\xef\xbf\xbd");
    } else if (character.code == '\n') {
      sink.Write("\\n");
    } else if (character.code == '\t') {
      sink.Write("\\t");
    } else if (character.code < 0x20) {
      char escape[8];
      std::snprintf(escape, sizeof escape, "\\u%04x", static_cast<unsigned>(character.code));
      sink.Write(escape);
    } else {
      if (character.code < 0x80) sink.Write("\\");
      sink.Write(text.substr(0, character.length));
    }
    text.remove_prefix(character.length);
  }
  sink.Write("\"");
}

/// Writes "," between the parts of an array or object.
class Separator {
 public:
  explicit Separator(Sink& sink) : sink_(sink) {}
  void Next() {
    if (!first_) sink_.Write(", ");
    first_ = false;
  }

 private:
  Sink& sink_;
  bool first_ = true;
};

/// A member of the document behind others.
template <class Element, class Writer>
void WriteList(const char* key, const std::vector<Element>& elements, Sink& sink, Writer write) {
  sink.Write(std::string(", \"") + key + "\": [");
  Separator separator(sink);
  for (const Element& element : elements) {
    separator.Next();
    write(element, sink);
  }
  sink.Write("]");
}

/// What there is none of is null.
void WriteReason(const Reason& reason, Sink& sink) {
  const std::pair<const char*, const std::string&> members[] = {{"{\"operation\": ", reason.operation},
                                                                {", \"adapter\": ", reason.adapter},
                                                                {", \"code\": ", reason.code},
                                                                {", \"text\": ", reason.text}};
  for (const auto& [name, text] : members) {
    sink.Write(name);
    text.empty() ? sink.Write("null") : WriteString(text, sink);
  }
  sink.Write("}");
}

/// @p selection is of structures; null for all that they have.
void WriteValue(const Value& value, Selection* selection, Sink& sink);

void WriteStructure(const MetaObj::MetaStruct& structure, Selection* selection, Sink& sink) {
  sink.Write("{");
  Separator separator(sink);
  const auto write = [&](const std::string& name, const Value& field) {
    separator.Next();
    WriteString(name, sink);
    sink.Write(": ");
    WriteValue(field, nullptr, sink);
  };
  selection ? selection->ForEachField(structure, write) : ForEachField(structure, write);
  sink.Write("}");
}

void WriteValue(const Value& value, Selection* selection, Sink& sink) {
  if (!value.hasValue) return sink.Write("null");
  switch (value.type) {
    case MetaType::Bool:
      return sink.Write(value.truth ? "true" : "false");
    case MetaType::Int:
      return sink.Write(std::to_string(value.number));
    case MetaType::String:
      return WriteString(value.text, sink);
    case MetaType::Struct:
      return WriteStructure(static_cast<const MetaObj::MetaStruct&>(*value.object), selection, sink);
    case MetaType::List: {
      sink.Write("[");
      Separator separator(sink);
      ForEachElement(*value.object, [&](const MetaObj::MetaObject& element) {
        separator.Next();
        WriteValue(ValueOf(element), selection, sink);
      });
      return sink.Write("]");
    }
  }
}

}  // namespace

void WriteJson(const Report& report, Sink& sink) {
  sink.Write("{\"schema\": 1, \"status\": " + std::to_string(report.status));
  if (report.line != 0) sink.Write(", \"line\": " + std::to_string(report.line));
  WriteList("messages", report.messages, sink, WriteString);
  if (!report.reasons.empty()) WriteList("reasons", report.reasons, sink, WriteReason);
  if (!report.notes.empty()) WriteList("notes", report.notes, sink, WriteString);
  if (report.calls) WriteList("calls", *report.calls, sink, WriteString);
  sink.Write(", \"result\": ");
  Selection selection(report.fields);
  WriteValue(report.result ? ValueOf(*report.result) : Value{}, report.fields.empty() ? nullptr : &selection,
             sink);
  sink.Write("}\n");
}

}  // namespace Plinth

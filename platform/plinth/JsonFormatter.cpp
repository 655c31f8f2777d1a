#include <cstdio>

#include "plinth/Formatter.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using MetaObj::MetaType;

void WriteString(std::string_view text, Sink& sink) {
  std::string quoted = "\"";
  for (std::size_t at = 0; at < text.size();) {
    const Character character = DecodeUtf8(text, at);
    if (!character.valid) {
      quoted += "\xef\xbf\xbd";
    } else if (character.code == '"' || character.code == '\\') {
      quoted += '\\';
      quoted += text[at];
    } else if (character.code == '\n') {
      quoted += "\\n";
    } else if (character.code == '\t') {
      quoted += "\\t";
    } else if (character.code < 0x20) {
      char escape[8];
      std::snprintf(escape, sizeof escape, "\\u%04x", static_cast<unsigned>(character.code));
      quoted += escape;
    } else {
      quoted += text.substr(at, character.length);
    }
    at += character.length;
  }
  sink.Write(quoted += '"');
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

/// @p fields limits structures, unless it is empty; a field that the structure lacks is null.
void WriteValue(const MetaObj::MetaObject* value, const std::vector<std::string>& fields, Sink& sink);

void WriteStructure(const MetaObj::MetaStruct& structure, const std::vector<std::string>& fields,
                    Sink& sink) {
  sink.Write("{");
  Separator separator(sink);
  const auto write = [&](const std::string& name, const MetaObj::MetaObject* field) {
    separator.Next();
    WriteString(name, sink);
    sink.Write(": ");
    WriteValue(field, {}, sink);
  };
  for (const std::string& name : fields) write(name, FindField(structure, name));
  for (std::size_t index = 0; fields.empty() && index < structure.GetFieldCount(); ++index) {
    write(structure.GetFieldName(index), structure.GetField(index).get());
  }
  sink.Write("}");
}

/// Writes a scalar as @p write does, or null where it has no value.
template <class Scalar, class Writer>
void WriteScalar(const MetaObj::MetaObject& value, Sink& sink, Writer write) {
  const auto& scalar = static_cast<const Scalar&>(value);
  if (!scalar.HasValue()) return sink.Write("null");
  write(scalar.GetValue());
}

void WriteValue(const MetaObj::MetaObject* value, const std::vector<std::string>& fields, Sink& sink) {
  if (!value) return sink.Write("null");
  switch (value->GetType()) {
    case MetaType::Bool:
      return WriteScalar<MetaObj::MetaBool>(*value, sink,
                                            [&](bool truth) { sink.Write(truth ? "true" : "false"); });
    case MetaType::Int:
      return WriteScalar<MetaObj::MetaInt>(*value, sink,
                                           [&](long long number) { sink.Write(std::to_string(number)); });
    case MetaType::String:
      return WriteScalar<MetaObj::MetaString>(*value, sink,
                                              [&](const std::string& text) { WriteString(text, sink); });
    case MetaType::Struct:
      return WriteStructure(static_cast<const MetaObj::MetaStruct&>(*value), fields, sink);
    case MetaType::List: {
      sink.Write("[");
      Separator separator(sink);
      ForEachElement(*value, [&](const MetaObj::MetaObject& element) {
        separator.Next();
        WriteValue(&element, fields, sink);
      });
      return sink.Write("]");
    }
  }
}

class Json final : public Formatter {
 public:
  bool IsDocument() const override { return true; }

  void Write(const Report& report, Sink& sink) const override {
    sink.Write("{\"schema\": 1, \"status\": " + std::to_string(report.status) + ", \"messages\": [");
    Separator separator(sink);
    for (const std::string& message : report.messages) {
      separator.Next();
      WriteString(message, sink);
    }
    sink.Write("], \"result\": ");
    WriteValue(report.result, report.fields, sink);
    sink.Write("}\n");
  }
};

}  // namespace

const Formatter& JsonFormatter() {
  static const Json formatter;
  return formatter;
}

}  // namespace Plinth

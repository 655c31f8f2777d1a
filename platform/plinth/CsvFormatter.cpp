#include "plinth/Formatter.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

/// A text as RFC 4180 has it: its line breaks stay, in quotes. What could steer a terminal is escaped.
void AppendText(std::string_view text, std::string& record) {
  const std::string visible = Visible(text, Lines::Kept);
  if (visible.find_first_of(",\"\n") == visible.npos) {
    record += visible;
    return;
  }
  record += '"';
  for (const char byte : visible) record.append(byte == '"' ? 2 : 1, byte);
  record += '"';
}

void AppendValue(const Value& value, std::string& space, std::string& record) {
  AppendText(value.type == MetaObj::MetaType::String ? value.text : ValueText(value, space), record);
}

/// Writes records, each in the room of the one before it.
class RecordWriter {
 public:
  explicit RecordWriter(Sink& sink) : sink_(sink) {}

  void Append(const Value& value) {
    if (!std::exchange(isFirst_, false)) record_ += ',';
    AppendValue(value, space_, record_);
  }
  void End() {
    // Readers take an empty line for no record at all.
    if (record_.empty()) record_ = "\"\"";
    sink_.Write(record_ += "\r\n");
    record_.clear();
    isFirst_ = true;
  }

 private:
  Sink& sink_;
  std::string record_;
  std::string space_;
  bool isFirst_ = true;
};

}  // namespace

void WriteCsv(const Report& report, Sink& sink) {
  const MetaObj::MetaStruct* const declared = StructureOf(*report.result);
  // A single value, such as help or a script, is no table.
  if (!declared && report.result->GetType() != MetaObj::MetaType::List) {
    return WritePlain(*report.result, sink);
  }
  std::vector<std::string> fields;
  if (declared) fields = report.fields.empty() ? FieldNames(*declared) : report.fields;
  RecordWriter records(sink);
  if (declared && report.hasHeader) {
    for (const std::string& name : fields) records.Append({.hasValue = true, .text = name});
    records.End();
  }
  Selection selection(std::move(fields));
  ForEachElement(*report.result, [&](const MetaObj::MetaObject& element) {
    if (element.GetType() == MetaObj::MetaType::Struct) {
      selection.ForEachField(static_cast<const MetaObj::MetaStruct&>(element),
                             [&](const std::string&, const Value& value) { records.Append(value); });
    } else {
      records.Append(ValueOf(element));
    }
    records.End();
  });
}

}  // namespace Plinth

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

void AppendValue(const MetaObj::MetaObject* value, std::string& space, std::string& record) {
  const bool isText = value && value->GetType() == MetaObj::MetaType::String;
  AppendText(isText ? static_cast<const MetaObj::MetaString&>(*value).GetValue() : ValueText(value, space),
             record);
}

/// Writes a record of @p fields, each appended by @p append.
template <class Append>
void WriteRecord(const std::vector<std::string>& fields, std::string& record, Sink& sink, Append append) {
  record.clear();
  for (const std::string& field : fields) {
    if (&field != fields.data()) record += ',';
    append(field);
  }
  // Readers take an empty line for no record at all.
  if (record.empty()) record = "\"\"";
  sink.Write(record += "\r\n");
}

}  // namespace

void WriteCsv(const Report& report, Sink& sink) {
  const MetaObj::MetaStruct* const declared = StructureOf(*report.result);
  // A single value, such as help or a script, is no table.
  if (!declared && report.result->GetType() != MetaObj::MetaType::List) {
    return WritePlain(*report.result, sink);
  }
  std::vector<std::string> fields{""};
  if (declared) fields = report.fields.empty() ? FieldNames(*declared) : report.fields;
  std::string space;
  std::string record;
  if (declared && report.hasHeader) {
    WriteRecord(fields, record, sink, [&](const std::string& name) { AppendText(name, record); });
  }
  ForEachElement(*report.result, [&](const MetaObj::MetaObject& element) {
    const bool isStructure = element.GetType() == MetaObj::MetaType::Struct;
    WriteRecord(fields, record, sink, [&](const std::string& name) {
      AppendValue(isStructure ? FindField(static_cast<const MetaObj::MetaStruct&>(element), name) : &element,
                  space, record);
    });
  });
}

}  // namespace Plinth

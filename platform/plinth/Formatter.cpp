#include "plinth/Formatter.h"

#include <charconv>

#include "plinth/Text.h"

namespace Plinth {

using MetaObj::MetaType;

namespace {

struct Entry {
  const char* name;
  const Formatter& (*get)();
};

/// Every formatter there is, in the order that help shows.
constexpr Entry kFormatters[] = {
    {"simple", SimpleFormatter},
    {"table", TableFormatter},
    {"json", JsonFormatter},
};

}  // namespace

std::vector<std::string> FormatterNames() {
  std::vector<std::string> names;
  for (const Entry& entry : kFormatters) names.emplace_back(entry.name);
  return names;
}

const Formatter* FindFormatter(const std::string& name) {
  for (const Entry& entry : kFormatters) {
    if (name == entry.name) return &entry.get();
  }
  return nullptr;
}

std::vector<std::string> ShownFields(const Report& report, const MetaObj::MetaStruct& structure) {
  if (!report.fields.empty()) return report.fields;
  const std::string* fields = FindValue(report.settings, "fields:" + structure.GetTypeName());
  if (!fields) fields = FindValue(report.settings, "fields");
  return fields ? Split(*fields, ',') : FieldNames(structure);
}

std::string ValueText(const MetaObj::MetaObject& value) {
  switch (value.GetType()) {
    case MetaType::Bool: {
      const auto& truth = static_cast<const MetaObj::MetaBool&>(value);
      return !truth.HasValue() ? "" : truth.GetValue() ? "true" : "false";
    }
    case MetaType::Int: {
      const auto& number = static_cast<const MetaObj::MetaInt&>(value);
      return number.HasValue() ? std::to_string(number.GetValue()) : "";
    }
    case MetaType::String:
      return Visible(static_cast<const MetaObj::MetaString&>(value).GetValue());
    case MetaType::Struct: {
      const auto& structure = static_cast<const MetaObj::MetaStruct&>(value);
      std::vector<std::string> parts;
      for (const std::string& name : FieldNames(structure)) {
        parts.push_back(Visible(name) + '=' + FieldText(structure, name));
      }
      return Join(parts, " ");
    }
    case MetaType::List: {
      std::vector<std::string> parts;
      ForEachElement(value, [&](const MetaObj::MetaObject& element) { parts.push_back(ValueText(element)); });
      return Join(parts, ", ");
    }
  }
  return "";
}

std::string FieldText(const MetaObj::MetaStruct& structure, const std::string& name) {
  const MetaObj::MetaObject* field = FindField(structure, name);
  return field ? ValueText(*field) : "";
}

void WritePlain(const MetaObj::MetaObject& result, Sink& sink) {
  if (result.GetType() == MetaType::String) {
    const std::string text = Visible(static_cast<const MetaObj::MetaString&>(result).GetValue(), Lines::Kept);
    sink.Write(text);
    if (text.empty() || text.back() != '\n') sink.Write("\n");
    return;
  }
  ForEachElement(result, [&](const MetaObj::MetaObject& element) { sink.Write(ValueText(element) + '\n'); });
}

}  // namespace Plinth

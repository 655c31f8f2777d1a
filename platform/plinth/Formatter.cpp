#include "plinth/Formatter.h"

#include <utility>

#include "plinth/Text.h"

namespace Plinth {

using MetaObj::MetaType;

std::vector<std::string> FormatterNames() {
  std::vector<std::string> names;
  for (const Formatter& formatter : kFormatters) names.emplace_back(formatter.name);
  return names;
}

const Formatter* FindFormatter(const std::string& name) {
  for (const Formatter& formatter : kFormatters) {
    if (name == formatter.name) return &formatter;
  }
  return nullptr;
}

std::vector<std::string> ShownFields(const Report& report, const std::string& typeName) {
  if (!report.fields.empty()) return report.fields;
  const std::string* fields = FindValue(report.settings, "fields:" + typeName);
  if (!fields) fields = FindValue(report.settings, "fields");
  return fields ? Split(*fields, ',') : std::vector<std::string>();
}

namespace {

/// A structure or list in one line.
std::string JoinedText(const MetaObj::MetaObject& value) {
  std::string joined;
  std::string space;
  const auto append = [&](std::string_view separator, const Value& part) {
    joined.append(separator).append(ValueText(part, space));
  };
  if (value.GetType() == MetaType::List) {
    std::string_view separator;
    ForEachElement(value, [&](const MetaObj::MetaObject& element) {
      append(std::exchange(separator, ", "), ValueOf(element));
    });
  } else {
    ForEachField(static_cast<const MetaObj::MetaStruct&>(value), [&](const auto& name, const Value& field) {
      append((joined.empty() ? "" : " ") + Visible(name) + '=', field);
    });
  }
  return joined;
}

}  // namespace

std::string_view ValueText(const Value& value, std::string& space) {
  if (!value.hasValue) return "";
  switch (value.type) {
    case MetaType::Bool:
      return value.truth ? "true" : "false";
    case MetaType::Int:
      return space = std::to_string(value.number);
    case MetaType::String:
      if (PlainLength(value.text) == value.text.size()) return value.text;
      return space = Visible(value.text);
    case MetaType::Struct:
    case MetaType::List:
      return space = JoinedText(*value.object);
  }
  return "";
}

void WritePlain(const MetaObj::MetaObject& result, Sink& sink) {
  if (result.GetType() == MetaType::String) {
    const std::string text = Visible(static_cast<const MetaObj::MetaString&>(result).GetValue(), Lines::Kept);
    sink.Write(text);
    if (text.empty() || text.back() != '\n') sink.Write("\n");
    return;
  }
  std::string space;
  ForEachElement(result, [&](const MetaObj::MetaObject& element) {
    sink.Write(ValueText(ValueOf(element), space));
    sink.Write("\n");
  });
}

}  // namespace Plinth

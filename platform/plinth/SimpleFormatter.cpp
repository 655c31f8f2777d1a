#include "plinth/Formatter.h"
#include "plinth/Text.h"
#include "plinth/Tty.h"

namespace Plinth {

namespace {

/// How structures of one type are shown.
struct Style {
  Style(const Report& report, const std::string& typeName)
      : type(typeName),
        fields(ShownFields(report, typeName)),
        header(FindValue(report.settings, "header:" + typeName)),
        isColored(report.isColored) {}

  std::string type;
  std::vector<std::string> fields;
  /// Null where they have none.
  const std::string* header;
  bool isColored;
};

void WriteStructure(const Style& style, const MetaObj::MetaStruct& structure, Sink& sink) {
  std::string space;
  if (style.header) {
    const auto lookup = [&](std::string_view name, std::string& value) {
      const MetaObj::MetaObject* field = FindField(structure, std::string(name));
      if (field) value = ValueText(field, space);
      return field != nullptr;
    };
    const std::string header = Expand(*style.header, lookup);
    sink.Write(style.isColored ? kHeading + header + kPlain + '\n' : header + '\n');
  }
  ForEachField(structure, style.fields, [&](const std::string& name, const MetaObj::MetaObject* field) {
    sink.Write("   ");
    sink.Write(Visible(name));
    sink.Write(": ");
    sink.Write(ValueText(field, space));
    sink.Write("\n");
  });
}

}  // namespace

void WriteSimple(const Report& report, Sink& sink) {
  const MetaObj::MetaStruct* shape = StructureOf(*report.result);
  if (!shape) return WritePlain(*report.result, sink);
  Style style(report, shape->GetTypeName());
  bool first = true;
  ForEachElement(*report.result, [&](const MetaObj::MetaObject& element) {
    if (!first) sink.Write("\n");
    first = false;
    if (element.GetType() != MetaObj::MetaType::Struct) return WritePlain(element, sink);
    const auto& structure = static_cast<const MetaObj::MetaStruct&>(element);
    if (structure.GetTypeName() != style.type) style = Style(report, structure.GetTypeName());
    WriteStructure(style, structure, sink);
  });
}

}  // namespace Plinth

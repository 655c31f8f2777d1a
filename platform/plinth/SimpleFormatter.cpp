#include <algorithm>
#include <optional>

#include "plinth/Formatter.h"
#include "plinth/Text.h"
#include "plinth/Tty.h"

namespace Plinth {

namespace {

/// How structures of one type are shown.
struct Style {
  Style(const Report& report, const std::string& typeName)
      : type(typeName),
        header(FindValue(report.settings, "header:" + typeName)),
        dense(FindValue(report.settings, "dense:" + typeName)),
        width(report.width),
        isColored(report.isColored) {
    std::vector<std::string> names = ShownFields(report, typeName);
    if (!names.empty()) fields.emplace(std::move(names));
  }

  bool IsInHeader(const std::string& name) const {
    return header && header->find('%' + name + '%') != header->npos;
  }

  /// @p text, broken to the terminal's width where the style has that.
  std::string Broken(const std::string& text, std::size_t indent) const {
    return dense && width != 0 ? Wrap(text, indent, width) : text;
  }
  bool MayBreak(const std::string& name) const {
    const std::vector<std::string> kept = Split(*dense, ',');
    return std::find(kept.begin(), kept.end(), name) == kept.end();
  }

  std::string type;
  /// All where there is none.
  std::optional<Selection> fields;
  /// Null where they have none.
  const std::string* header;
  /// The fields that are never broken; null where structures stand apart and are shown as they are.
  const std::string* dense;
  /// Columns of the terminal; 0 for no limit.
  std::size_t width;
  bool isColored;
};

void WriteStructure(Style& style, const MetaObj::MetaStruct& structure, Sink& sink) {
  std::string space;
  std::string text;
  if (style.header) {
    const auto lookup = [&](std::string_view name, std::string& value) {
      const std::size_t place = Structure::Of(structure).GetShape().Find(name);
      value = ValueText(Structure::Of(structure).GetValue(place), space);
      return place != Shape::kNone;
    };
    const std::string header = style.Broken(Expand(*style.header, lookup), 3);
    text += style.isColored ? kHeading + header + kPlain + '\n' : header + '\n';
  }
  const auto append = [&](const std::string& name, const Value& field) {
    const std::string_view value = ValueText(field, space);
    if (style.dense && (value.empty() || style.IsInHeader(name))) return;
    text += "   ";
    if (style.dense && style.MayBreak(name)) {
      text += style.Broken(Visible(name) + ": " + std::string(value), 6) + '\n';
      return;
    }
    PlainLength(name) == name.size() ? text += name : text += Visible(name);
    text.append(": ").append(value) += '\n';
  };
  style.fields ? style.fields->ForEachField(structure, append) : ForEachField(structure, append);
  sink.Write(text);
}

}  // namespace

void WriteSimple(const Report& report, Sink& sink) {
  const MetaObj::MetaStruct* shape = StructureOf(*report.result);
  if (!shape) return WritePlain(*report.result, sink);
  Style style(report, shape->GetTypeName());
  bool first = true;
  ForEachElement(*report.result, [&](const MetaObj::MetaObject& element) {
    if (!first && !style.dense) sink.Write("\n");
    first = false;
    if (element.GetType() != MetaObj::MetaType::Struct) return WritePlain(element, sink);
    const auto& structure = static_cast<const MetaObj::MetaStruct&>(element);
    if (structure.GetTypeName() != style.type) style = Style(report, structure.GetTypeName());
    WriteStructure(style, structure, sink);
  });
}

}  // namespace Plinth

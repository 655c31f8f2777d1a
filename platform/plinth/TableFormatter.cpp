#include <algorithm>

#include "plinth/Formatter.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

struct Column {
  std::string field;
  /// The field's name as shown.
  std::string title;
  bool right = false;
  std::size_t width = 0;
};

/// Writes one row; @p cell gives the text of a column.
template <class Cell>
void WriteRow(const std::vector<Column>& columns, Sink& sink, Cell cell) {
  std::string line;
  for (const Column& column : columns) {
    const std::string text = cell(column);
    const std::size_t width = DisplayWidth(text);
    const std::string padding(column.width > width ? column.width - width : 0, ' ');
    if (&column != columns.data()) line += "  ";
    line += column.right ? padding + text : text + padding;
  }
  line.erase(line.find_last_not_of(' ') + 1);
  sink.Write(line + '\n');
}

class Table final : public Formatter {
 public:
  void Write(const Report& report, Sink& sink) const override {
    const MetaObj::MetaStruct* structure = StructureOf(*report.result);
    if (!structure) return WritePlain(*report.result, sink);
    std::vector<Column> columns = Columns(report, *structure);
    // The widths are known only when every cell was seen; texts are made twice rather than kept.
    ForEachElement(*report.result, [&](const MetaObj::MetaObject& element) {
      for (Column& column : columns)
        column.width = std::max(column.width, DisplayWidth(Cell(element, column)));
    });
    WriteRow(columns, sink, [](const Column& column) { return column.title; });
    WriteRow(columns, sink, [](const Column& column) { return std::string(column.width, '-'); });
    ForEachElement(*report.result, [&](const MetaObj::MetaObject& element) {
      WriteRow(columns, sink, [&](const Column& column) { return Cell(element, column); });
    });
  }

 private:
  static std::vector<Column> Columns(const Report& report, const MetaObj::MetaStruct& structure) {
    std::vector<Column> columns;
    for (const std::string& name : ShownFields(report, structure)) {
      const MetaObj::MetaObject* field = FindField(structure, name);
      const std::string title = Visible(name);
      columns.push_back(
          {name, title, field && field->GetType() == MetaObj::MetaType::Int, DisplayWidth(title)});
    }
    return columns;
  }

  static std::string Cell(const MetaObj::MetaObject& element, const Column& column) {
    const auto* structure = dynamic_cast<const MetaObj::MetaStruct*>(&element);
    return structure ? FieldText(*structure, column.field) : "";
  }
};

}  // namespace

const Formatter& TableFormatter() {
  static const Table formatter;
  return formatter;
}

}  // namespace Plinth

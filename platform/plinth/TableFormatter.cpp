#include <algorithm>

#include "plinth/Formatter.h"
#include "plinth/Text.h"
#include "plinth/Tty.h"

namespace Plinth {

namespace {

struct Column {
  std::string field;
  /// The field's name as shown.
  std::string title;
  bool right = false;
  std::size_t width = 0;
};

/// What a column keeps however narrow the terminal is.
constexpr std::size_t kNarrowest = 8;

/// Takes columns from the widest texts until a row fits @p width; numbers keep theirs. Where that is not
/// enough, the table stays whole: it would be cut and broken over lines both.
void Fit(std::vector<Column>& columns, std::size_t width) {
  if (width == 0 || columns.empty()) return;
  std::size_t whole = 2 * columns.size() - 2;
  std::size_t spare = 0;
  for (const Column& column : columns) {
    whole += column.width;
    if (!column.right && column.width > kNarrowest) spare += column.width - kNarrowest;
  }
  if (whole > width + spare) return;
  const auto narrower = [](const Column& one, const Column& other) {
    return (one.right ? 0 : one.width) < (other.right ? 0 : other.width);
  };
  for (; whole > width; --whole) --std::max_element(columns.begin(), columns.end(), narrower)->width;
}

/// Writes one row; @p cell gives the text of a column. @p line is made anew, in the room that it has.
template <class Cell>
void WriteRow(const std::vector<Column>& columns, std::string& line, Sink& sink, Cell cell) {
  line.clear();
  for (const Column& column : columns) {
    std::string_view text = cell(column);
    std::size_t width = DisplayWidth(text);
    std::string shortened;
    if (width > column.width) {
      text = shortened = Shortened(text, column.width);
      width = DisplayWidth(text);
    }
    const std::size_t padding = column.width > width ? column.width - width : 0;
    if (&column != columns.data()) line += "  ";
    if (column.right) line.append(padding, ' ');
    line += text;
    if (!column.right) line.append(padding, ' ');
  }
  line.erase(line.find_last_not_of(' ') + 1);
  sink.Write(line += '\n');
}

std::vector<Column> Columns(const Report& report, const MetaObj::MetaStruct& structure) {
  std::vector<Column> columns;
  ForEachField(structure, ShownFields(report, structure.GetTypeName()),
               [&](const std::string& name, const MetaObj::MetaObject* field) {
                 const std::string title = Visible(name);
                 const bool right = field && field->GetType() == MetaObj::MetaType::Int;
                 columns.push_back({name, title, right, report.hasHeader ? DisplayWidth(title) : 0});
               });
  return columns;
}

/// As ValueText.
std::string_view Cell(const MetaObj::MetaObject& element, const Column& column, std::string& space) {
  if (element.GetType() != MetaObj::MetaType::Struct) return "";
  return ValueText(FindField(static_cast<const MetaObj::MetaStruct&>(element), column.field), space);
}

}  // namespace

void WriteTable(const Report& report, Sink& sink) {
  const MetaObj::MetaStruct* structure = StructureOf(*report.result);
  if (!structure) return WritePlain(*report.result, sink);
  std::vector<Column> columns = Columns(report, *structure);
  std::string space;
  // The widths are known only when every cell was seen. Most texts are shown as they are, so that making the
  // others twice costs less than keeping all.
  ForEachElement(*report.result, [&](const MetaObj::MetaObject& element) {
    for (Column& column : columns) {
      column.width = std::max(column.width, DisplayWidth(Cell(element, column, space)));
    }
  });
  Fit(columns, report.width);
  std::string line;
  if (report.hasHeader) {
    if (report.isColored) sink.Write(kHeading);
    WriteRow(columns, line, sink, [](const Column& column) { return std::string_view(column.title); });
    if (report.isColored) sink.Write(kPlain);
    WriteRow(columns, line, sink,
             [&](const Column& column) { return std::string_view(space.assign(column.width, '-')); });
  }
  ForEachElement(*report.result, [&](const MetaObj::MetaObject& element) {
    WriteRow(columns, line, sink, [&](const Column& column) { return Cell(element, column, space); });
  });
}

}  // namespace Plinth

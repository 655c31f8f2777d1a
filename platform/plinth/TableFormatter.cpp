#include <algorithm>

#include "plinth/Formatter.h"
#include "plinth/Text.h"
#include "plinth/Tty.h"

namespace Plinth {

namespace {

struct Column {
  /// The field's name as shown.
  std::string title;
  bool right = false;
  std::size_t width = 0;
  /// What it keeps however narrow the terminal is: numbers stay whole, of a text there is its first
  /// character, the mark and its last one.
  std::size_t least = 3;
};

/// Takes from the widest of those that can give until a row fits @p width. Where that is not enough, the
/// table stays whole: it would be cut and broken over lines both.
void Fit(std::vector<Column>& columns, std::size_t width) {
  if (width == 0 || columns.empty()) return;
  std::size_t whole = 2 * columns.size() - 2;
  std::size_t spare = 0;
  for (const Column& column : columns) {
    whole += column.width;
    if (column.width > column.least) spare += column.width - column.least;
  }
  if (whole > width + spare) return;
  const auto narrower = [](const Column& one, const Column& other) {
    return (one.width > one.least ? one.width : 0) < (other.width > other.least ? other.width : 0);
  };
  for (; whole > width; --whole) --std::max_element(columns.begin(), columns.end(), narrower)->width;
}

/// A text, and the columns that it takes.
struct Cell {
  Cell(std::string_view visible) : text(visible), width(DisplayWidth(visible)) {}
  /// As ValueText.
  Cell(const Value& value, std::string& space)
      : text(ValueText(value, space)),
        // Where nothing had to be escaped, that has been looked at.
        width(text.data() == value.text.data() ? text.size() : DisplayWidth(text)) {}

  std::string_view text;
  std::size_t width;
};

/// Many commands give numbers as texts.
bool IsNumber(std::string_view text) { return text.find_first_not_of("0123456789") == text.npos; }

/// Puts rows together, each in the room of the one before it.
class RowWriter {
 public:
  RowWriter(const std::vector<Column>& columns, Sink& sink) : columns_(columns), sink_(sink) {}

  /// The text of the next column.
  void Append(Cell cell) {
    const Column& column = columns_[next_];
    std::string shortened;
    if (cell.width > column.width) {
      shortened = Shortened(cell.text, column.width);
      cell = Cell(shortened);
    }
    const std::size_t padding = column.width > cell.width ? column.width - cell.width : 0;
    if (next_ != 0) line_ += "  ";
    if (column.right) line_.append(padding, ' ');
    line_ += cell.text;
    if (!column.right) line_.append(padding, ' ');
    ++next_;
  }
  void End() {
    line_.erase(line_.find_last_not_of(' ') + 1);
    sink_.Write(line_ += '\n');
    line_.clear();
    next_ = 0;
  }

 private:
  const std::vector<Column>& columns_;
  Sink& sink_;
  std::string line_;
  std::size_t next_ = 0;
};

/// The names of the columns, as @p structure declares them where none are chosen.
std::vector<std::string> FieldsOf(const Report& report, const MetaObj::MetaStruct& structure) {
  std::vector<std::string> fields = ShownFields(report, structure.GetTypeName());
  return fields.empty() ? FieldNames(structure) : fields;
}

}  // namespace

void WriteTable(const Report& report, Sink& sink) {
  const MetaObj::MetaStruct* structure = StructureOf(*report.result);
  if (!structure) return WritePlain(*report.result, sink);
  Selection selection(FieldsOf(report, *structure));
  std::vector<Column> columns;
  selection.ForEachField(*structure, [&](const std::string& name, const Value& declared) {
    const std::string title = Visible(name);
    const bool right = declared.type == MetaObj::MetaType::Int;
    columns.push_back({title, right, report.hasHeader ? DisplayWidth(title) : 0});
  });
  std::string space;
  const auto forEachCell = [&](const MetaObj::MetaObject& element, const auto& visit) {
    std::size_t column = 0;
    if (element.GetType() != MetaObj::MetaType::Struct) return;
    selection.ForEachField(
        static_cast<const MetaObj::MetaStruct&>(element),
        [&](const std::string&, const Value& value) { visit(columns[column++], Cell(value, space)); });
  };
  // The widths are known only when every cell was seen. Most texts are shown as they are, so that making the
  // others twice costs less than keeping all.
  ForEachElement(*report.result, [&](const MetaObj::MetaObject& element) {
    forEachCell(element, [](Column& column, const Cell& cell) {
      column.width = std::max(column.width, cell.width);
      if (column.right || IsNumber(cell.text)) column.least = std::max(column.least, cell.width);
    });
  });
  Fit(columns, report.width);
  RowWriter rows(columns, sink);
  if (report.hasHeader) {
    if (report.isColored) sink.Write(kHeading);
    for (const Column& column : columns) rows.Append(std::string_view(column.title));
    rows.End();
    if (report.isColored) sink.Write(kPlain);
    for (const Column& column : columns) rows.Append(std::string_view(space.assign(column.width, '-')));
    rows.End();
  }
  ForEachElement(*report.result, [&](const MetaObj::MetaObject& element) {
    forEachCell(element, [&](const Column&, const Cell& cell) { rows.Append(cell); });
    rows.End();
  });
}

}  // namespace Plinth

/// Structures as the framework keeps them: thousands of rows share the names of their fields, and a field is
/// an object of its own only once somebody asks for one.
#pragma once

#include <Plinth/MetaObj.h>

#include <cstddef>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace Plinth {

/// A value as formatters read it. It stays for as long as what it was read from, unchanged.
struct Value {
  MetaObj::MetaType type = MetaObj::MetaType::String;
  /// False for one that is not there, too.
  bool hasValue = false;
  bool truth = false;
  long long number = 0;
  std::string_view text = {};
  /// A structure or a list.
  const MetaObj::MetaObject* object = nullptr;
};

Value ValueOf(const MetaObj::MetaObject& object);

/// The type and the fields' names of structures, in their order. Those that have the same share one, which
/// stays until the process ends.
class Shape {
 public:
  static constexpr std::size_t kNone = static_cast<std::size_t>(-1);

  /// The one without fields.
  static const Shape& Of(const std::string& typeName);
  /// The one with a field more, which this one does not have.
  const Shape& With(const std::string& name) const;

  const std::string& GetTypeName() const { return type_->name; }
  std::size_t GetFieldCount() const { return names_.size(); }
  const std::string& GetFieldName(std::size_t index) const { return *names_[index]; }
  /// The field of that name, or kNone.
  std::size_t Find(std::string_view name) const;
  /// Where With leads for the field that mostly comes next, if it has this name; or null.
  const Shape* Next(std::string_view name) const;

 private:
  friend class Structure;
  /// What the last structure of the type took: the next one will take about as much.
  struct Type {
    std::string name;
    std::size_t fields = 0;
    std::size_t bytes = 0;
  };
  Shape() = default;

  std::shared_ptr<Type> type_;
  /// The last of the names; the others are those of the shapes that this one came from.
  std::string name_;
  std::vector<const std::string*> names_;
  /// Those with a field more, and the one that was asked for last.
  mutable std::vector<std::unique_ptr<Shape>> longer_;
  mutable const Shape* next_ = nullptr;
};

class Structure final : public MetaObj::MetaStruct {
 public:
  explicit Structure(const std::string& typeName) : shape_(&Shape::Of(typeName)) {}
  /// All there are come from New.
  static const Structure& Of(const MetaObj::MetaStruct& structure) {
    return static_cast<const Structure&>(structure);
  }

  const Shape& GetShape() const { return *shape_; }
  /// The field @p index; none for Shape::kNone.
  Value GetValue(std::size_t index) const;

  MetaObj::MetaType GetType() const override { return MetaObj::MetaType::Struct; }
  void SetField(const std::string& name, bool value) override;
  void SetField(const std::string& name, int value) override;
  void SetField(const std::string& name, long long value) override;
  void SetField(const std::string& name, const char* value) override;
  void SetField(const std::string& name, const std::string& value) override;
  void SetField(const std::string& name, boost::shared_ptr<MetaObj::MetaObject> value) override;
  const std::string& GetTypeName() const override { return shape_->GetTypeName(); }
  std::size_t GetFieldCount() const override { return shape_->GetFieldCount(); }
  const std::string& GetFieldName(std::size_t index) const override { return shape_->GetFieldName(index); }
  const boost::shared_ptr<MetaObj::MetaObject>& GetField(std::size_t index) const override;

 private:
  /// A scalar that has a value, or else a Struct: an object that was given.
  struct Cell {
    MetaObj::MetaType type;
    /// The truth, the number, or the place of a text in text_.
    long long number;
    std::size_t length;
  };
  /// Returns where the field is.
  std::size_t Put(const std::string& name, const Cell& cell);
  void PutText(const std::string& name, std::string_view value);
  bool IsGiven(const Cell& cell) const { return cell.type == MetaObj::MetaType::Struct; }

  const Shape* shape_;
  std::vector<Cell> cells_;
  std::string text_;
  /// Of the cells, or the first of them; null where none was given nor asked for.
  mutable std::vector<boost::shared_ptr<MetaObj::MetaObject>> objects_;
};

}  // namespace Plinth

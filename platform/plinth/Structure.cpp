#include "plinth/Structure.h"

#include <boost/make_shared.hpp>
#include <map>
#include <utility>

namespace Plinth {

using MetaObj::MetaObject;
using MetaObj::MetaType;

Value ValueOf(const MetaObject& object) {
  Value value{.type = object.GetType()};
  const auto take = [&]<class Scalar>(const Scalar& scalar, auto& into) {
    value.hasValue = scalar.HasValue();
    into = scalar.GetValue();
  };
  switch (value.type) {
    case MetaType::Bool:
      take(static_cast<const MetaObj::MetaBool&>(object), value.truth);
      break;
    case MetaType::Int:
      take(static_cast<const MetaObj::MetaInt&>(object), value.number);
      break;
    case MetaType::String:
      take(static_cast<const MetaObj::MetaString&>(object), value.text);
      break;
    case MetaType::Struct:
    case MetaType::List:
      value.hasValue = true;
      value.object = &object;
      break;
  }
  return value;
}

const Shape& Shape::Of(const std::string& typeName) {
  static auto& shapes = *new std::map<std::string, Shape, std::less<>>;
  static const Shape* last = nullptr;
  if (last != nullptr && last->GetTypeName() == typeName) return *last;
  auto found = shapes.find(typeName);
  if (found == shapes.end()) {
    Shape shape;
    shape.type_ = std::make_shared<Type>(Type{.name = typeName});
    found = shapes.emplace(typeName, std::move(shape)).first;
  }
  return *(last = &found->second);
}

const Shape& Shape::With(const std::string& name) const {
  for (const auto& longer : longer_) {
    if (longer->name_ == name) return *(next_ = longer.get());
  }
  std::unique_ptr<Shape> longer(new Shape);
  longer->type_ = type_;
  longer->name_ = name;
  longer->names_ = names_;
  longer->names_.push_back(&longer->name_);
  longer_.push_back(std::move(longer));
  return *(next_ = longer_.back().get());
}

std::size_t Shape::Find(std::string_view name) const {
  for (std::size_t index = 0; index < names_.size(); ++index) {
    if (*names_[index] == name) return index;
  }
  return kNone;
}

const Shape* Shape::Next(std::string_view name) const {
  return next_ != nullptr && next_->name_ == name ? next_ : nullptr;
}

Value Structure::GetValue(std::size_t index) const {
  if (index == Shape::kNone) return {};
  const Cell& cell = cells_[index];
  if (IsGiven(cell)) return ValueOf(*objects_[index]);
  Value value{.type = cell.type, .hasValue = true, .truth = cell.number != 0, .number = cell.number};
  if (cell.type == MetaType::String) {
    value.text = std::string_view(text_).substr(static_cast<std::size_t>(cell.number), cell.length);
  }
  return value;
}

std::size_t Structure::Put(const std::string& name, const Cell& cell) {
  const Shape* longer = shape_->Next(name);
  if (longer == nullptr) {
    if (const std::size_t index = shape_->Find(name); index != Shape::kNone) {
      cells_[index] = cell;
      if (index < objects_.size()) objects_[index] = nullptr;
      return index;
    }
    longer = &shape_->With(name);
  }
  if (cells_.empty()) cells_.reserve(shape_->type_->fields);
  cells_.push_back(cell);
  shape_ = longer;
  shape_->type_->fields = cells_.size();
  return cells_.size() - 1;
}

void Structure::PutText(const std::string& name, std::string_view value) {
  if (const std::size_t index = shape_->Next(name) == nullptr ? shape_->Find(name) : Shape::kNone;
      index != Shape::kNone && cells_[index].type == MetaType::String &&
      value.size() <= cells_[index].length) {
    Cell& cell = cells_[index];
    text_.replace(static_cast<std::size_t>(cell.number), value.size(), value);
    cell.length = value.size();
    if (index < objects_.size()) objects_[index] = nullptr;
    return;
  }
  constexpr std::size_t kLonger = 16;  // than that of the row before it
  if (text_.empty()) text_.reserve(shape_->type_->bytes + kLonger);
  const std::size_t begin = text_.size();
  text_ += value;
  shape_->type_->bytes = text_.size();
  Put(name, {MetaType::String, static_cast<long long>(begin), value.size()});
}

void Structure::SetField(const std::string& name, bool value) { Put(name, {MetaType::Bool, value, 0}); }
void Structure::SetField(const std::string& name, int value) { Put(name, {MetaType::Int, value, 0}); }
void Structure::SetField(const std::string& name, long long value) { Put(name, {MetaType::Int, value, 0}); }
void Structure::SetField(const std::string& name, const char* value) { PutText(name, value); }
void Structure::SetField(const std::string& name, const std::string& value) { PutText(name, value); }

void Structure::SetField(const std::string& name, boost::shared_ptr<MetaObject> value) {
  if (objects_.size() <= cells_.size()) objects_.resize(cells_.size() + 1);
  const std::size_t index = Put(name, {MetaType::Struct, 0, 0});
  objects_[index] = std::move(value);
}

const boost::shared_ptr<MetaObject>& Structure::GetField(std::size_t index) const {
  if (objects_.size() < cells_.size()) objects_.resize(cells_.size());
  boost::shared_ptr<MetaObject>& object = objects_[index];
  if (object == nullptr) {
    const Value value = GetValue(index);
    switch (value.type) {
      case MetaType::Bool:
        object = MetaObj::MetaBool::New(value.truth);
        break;
      case MetaType::Int:
        object = MetaObj::MetaInt::New(value.number);
        break;
      default:
        object = MetaObj::MetaString::New(std::string(value.text));
        break;
    }
  }
  return object;
}

boost::shared_ptr<MetaObj::MetaStruct> MetaObj::MetaStruct::New(const std::string& typeName) {
  return boost::make_shared<Structure>(typeName);
}

}  // namespace Plinth

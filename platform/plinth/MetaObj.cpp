#include <Plinth/MetaObj.h>

#include <algorithm>
#include <boost/make_shared.hpp>
#include <boost/shared_ptr.hpp>
#include <optional>
#include <set>
#include <utility>
#include <vector>

namespace Plinth::MetaObj {

MetaObject::~MetaObject() = default;

namespace {

/// The scalars differ in their types alone.
template <class Base, class Value, class Returned, MetaType kType>
class Scalar final : public Base {
 public:
  explicit Scalar(std::optional<Value> value) : hasValue_(value.has_value()) {
    if (value) value_ = std::move(*value);
  }
  MetaType GetType() const override { return kType; }
  bool HasValue() const override { return hasValue_; }
  Returned GetValue() const override { return value_; }

 private:
  bool hasValue_;
  Value value_{};
};

using Bool = Scalar<MetaBool, bool, bool, MetaType::Bool>;
using Int = Scalar<MetaInt, long long, long long, MetaType::Int>;
using String = Scalar<MetaString, std::string, const std::string&, MetaType::String>;

/// The one copy of a name, which stays. Thousands of rows have the same names, each at the same @p place.
const std::string& Shared(const std::string& name, std::size_t place) {
  static auto& names = *new std::set<std::string>;
  static auto& before = *new std::vector<const std::string*>;
  if (place < before.size() && *before[place] == name) return *before[place];
  const std::string& shared = *names.insert(name).first;
  before.resize(std::max(before.size(), place + 1), &shared);
  before[place] = &shared;
  return shared;
}

class Struct final : public MetaStruct {
 public:
  explicit Struct(const std::string& typeName) : typeName_(Shared(typeName, 0)) {}

  MetaType GetType() const override { return MetaType::Struct; }
  void SetField(const std::string& name, bool value) override { SetField(name, MetaBool::New(value)); }
  void SetField(const std::string& name, int value) override { SetField(name, MetaInt::New(value)); }
  void SetField(const std::string& name, long long value) override { SetField(name, MetaInt::New(value)); }
  void SetField(const std::string& name, const char* value) override {
    SetField(name, MetaString::New(value));
  }
  void SetField(const std::string& name, const std::string& value) override {
    SetField(name, MetaString::New(value));
  }
  void SetField(const std::string& name, boost::shared_ptr<MetaObject> value) override {
    for (auto& field : fields_) {
      if (*field.first != name) continue;
      field.second = std::move(value);
      return;
    }
    if (fields_.empty()) fields_.reserve(8);  // as many as most have
    fields_.emplace_back(&Shared(name, fields_.size() + 1), std::move(value));
  }

  const std::string& GetTypeName() const override { return typeName_; }
  std::size_t GetFieldCount() const override { return fields_.size(); }
  const std::string& GetFieldName(std::size_t index) const override { return *fields_[index].first; }
  const boost::shared_ptr<MetaObject>& GetField(std::size_t index) const override {
    return fields_[index].second;
  }

 private:
  template <class Meta>
  void SetField(const std::string& name, boost::shared_ptr<Meta> value) {
    SetField(name, boost::shared_ptr<MetaObject>(std::move(value)));
  }

  const std::string& typeName_;
  std::vector<std::pair<const std::string*, boost::shared_ptr<MetaObject>>> fields_;
};

class List final : public MetaList {
 public:
  List(MetaType elementType, boost::shared_ptr<MetaObject> prototype)
      : elementType_(elementType), prototype_(std::move(prototype)) {}

  MetaType GetType() const override { return MetaType::List; }
  void Append(boost::shared_ptr<MetaObject> element) override { elements_.push_back(std::move(element)); }
  MetaType GetElementType() const override { return elementType_; }
  const boost::shared_ptr<MetaObject>& GetPrototype() const override { return prototype_; }
  std::size_t GetSize() const override { return elements_.size(); }
  const boost::shared_ptr<MetaObject>& GetElement(std::size_t index) const override {
    return elements_[index];
  }

 private:
  MetaType elementType_;
  boost::shared_ptr<MetaObject> prototype_;
  std::vector<boost::shared_ptr<MetaObject>> elements_;
};

template <class Object, class... Arguments>
boost::shared_ptr<Object> Make(Arguments&&... arguments) {
  return boost::make_shared<Object>(std::forward<Arguments>(arguments)...);
}

}  // namespace

boost::shared_ptr<MetaBool> MetaBool::New() { return Make<Bool>(std::nullopt); }
boost::shared_ptr<MetaBool> MetaBool::New(bool value) { return Make<Bool>(value); }
boost::shared_ptr<MetaInt> MetaInt::New() { return Make<Int>(std::nullopt); }
boost::shared_ptr<MetaInt> MetaInt::New(long long value) { return Make<Int>(value); }
boost::shared_ptr<MetaString> MetaString::New() { return Make<String>(std::nullopt); }
boost::shared_ptr<MetaString> MetaString::New(const std::string& value) { return Make<String>(value); }

boost::shared_ptr<MetaStruct> MetaStruct::New(const std::string& typeName) { return Make<Struct>(typeName); }

boost::shared_ptr<MetaList> MetaList::New(MetaType elementType, boost::shared_ptr<MetaObject> prototype) {
  return Make<List>(elementType, std::move(prototype));
}

}  // namespace Plinth::MetaObj

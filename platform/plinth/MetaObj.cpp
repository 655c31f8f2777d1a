#include <Plinth/MetaObj.h>

#include <boost/make_shared.hpp>
#include <boost/shared_ptr.hpp>
#include <optional>
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

boost::shared_ptr<MetaList> MetaList::New(MetaType elementType, boost::shared_ptr<MetaObject> prototype) {
  return Make<List>(elementType, std::move(prototype));
}

}  // namespace Plinth::MetaObj

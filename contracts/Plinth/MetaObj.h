/// Result values of the command-line framework.
///
/// Every object crosses as a boost::shared_ptr and comes from a static New(). A value made by New()
/// without an argument has a type and no value: in a prototype it declares a field, in a posted result
/// it is shown as an empty text, or as null in a structured document.
///
/// Nothing here throws but std::bad_alloc, unless an operation says otherwise.
#pragma once

#include <boost/shared_ptr.hpp>
#include <cstddef>
#include <string>

#pragma GCC visibility push(default)

namespace Plinth::MetaObj {

/// What a result value is. The numbers are part of the binary interface.
enum class MetaType : int { Bool = 0, Int = 1, String = 2, Struct = 3, List = 4 };

/// Base of all result values. Objects are compared by identity and never copied.
class MetaObject {
 public:
  MetaObject(const MetaObject&) = delete;
  MetaObject& operator=(const MetaObject&) = delete;
  virtual ~MetaObject();
  /// The type, fixed when the object is made; it tells which class to cast to.
  virtual MetaType GetType() const = 0;

 protected:
  MetaObject() = default;
};

/// A truth value.
class MetaBool : public MetaObject {
 public:
  static boost::shared_ptr<MetaBool> New();
  static boost::shared_ptr<MetaBool> New(bool value);
  /// False for an object made by New() without an argument.
  virtual bool HasValue() const = 0;
  /// The value; false where there is none.
  virtual bool GetValue() const = 0;
};

/// A signed whole number of 64 bits.
class MetaInt : public MetaObject {
 public:
  static boost::shared_ptr<MetaInt> New();
  static boost::shared_ptr<MetaInt> New(long long value);
  /// False for an object made by New() without an argument.
  virtual bool HasValue() const = 0;
  /// The value; 0 where there is none.
  virtual long long GetValue() const = 0;
};

/// A text, UTF-8 by convention; other bytes are carried unchanged.
class MetaString : public MetaObject {
 public:
  static boost::shared_ptr<MetaString> New();
  static boost::shared_ptr<MetaString> New(const std::string& value);
  /// False for an object made by New() without an argument. An empty text is a value.
  virtual bool HasValue() const = 0;
  /// The text; empty where there is none.
  virtual const std::string& GetValue() const = 0;
};

/// A structure: named fields in the order in which they were first set.
class MetaStruct : public MetaObject {
 public:
  /// A structure of type @p typeName without fields. The name is what formatter parameters such as
  /// "fields:iScsiAdapter" refer to.
  static boost::shared_ptr<MetaStruct> New(const std::string& typeName);

  /// Sets a field. A field that exists keeps its place and takes the new value.
  virtual void SetField(const std::string& name, bool value) = 0;
  virtual void SetField(const std::string& name, int value) = 0;
  virtual void SetField(const std::string& name, long long value) = 0;
  /// @p value is copied and must not be null.
  virtual void SetField(const std::string& name, const char* value) = 0;
  virtual void SetField(const std::string& name, const std::string& value) = 0;
  /// Shares @p value with the caller. It must not be null.
  virtual void SetField(const std::string& name, boost::shared_ptr<MetaObject> value) = 0;

  virtual const std::string& GetTypeName() const = 0;
  virtual std::size_t GetFieldCount() const = 0;
  /// @p index counts from 0 and must be below GetFieldCount().
  virtual const std::string& GetFieldName(std::size_t index) const = 0;
  /// @p index counts from 0 and must be below GetFieldCount(). Never null.
  virtual const boost::shared_ptr<MetaObject>& GetField(std::size_t index) const = 0;
};

/// A list whose elements are all of one type.
class MetaList : public MetaObject {
 public:
  /// An empty list. @p prototype, shared with the caller, tells the fields of an element; it is not an
  /// element itself. Null, or a structure without fields, leaves it to the elements.
  static boost::shared_ptr<MetaList> New(MetaType elementType, boost::shared_ptr<MetaObject> prototype);

  /// Appends an element of the element type, shared with the caller. It must not be null.
  virtual void Append(boost::shared_ptr<MetaObject> element) = 0;

  virtual MetaType GetElementType() const = 0;
  /// As given to New(); may be null.
  virtual const boost::shared_ptr<MetaObject>& GetPrototype() const = 0;
  virtual std::size_t GetSize() const = 0;
  /// @p index counts from 0 and must be below GetSize(). Never null.
  virtual const boost::shared_ptr<MetaObject>& GetElement(std::size_t index) const = 0;
};

}  // namespace Plinth::MetaObj

#pragma GCC visibility pop

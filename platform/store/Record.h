/// The settings of one object: a JSON object behind typed getters and setters.
///
/// It is kept in the form in which it is stored (Bson.h): reading a key costs what finding that key does, and
/// nothing is made of the rest.
///
/// A path is a key, or keys and list indices with slashes between: "properties/vendor", "addresses/0/port".
/// Records are stored complete, so a getter that finds nothing, or another type, means a damaged host and
/// throws store::Error; a key that may be missing is asked for with Has first.
#pragma once

#include <cstdint>
#include <nlohmann/json_fwd.hpp>
#include <span>
#include <string>
#include <string_view>
#include <utility>

#pragma GCC visibility push(default)

namespace store {

using Json = nlohmann::ordered_json;

namespace bson {
struct Element;
enum class Type : unsigned char;
}  // namespace bson

class Record {
 public:
  Record();
  /// @p json is an object.
  explicit Record(const Json& json);

  /// The record that is stored as @p bytes. That they are one is found out as they are read.
  static Record Stored(std::string_view bytes);
  /// Becomes that one, in the memory that it has.
  void Restore(std::string_view bytes);
  const std::string& Bytes() const { return bytes_; }
  bool operator==(const Record& other) const { return bytes_ == other.bytes_; }

  bool Has(std::string_view path) const;
  std::string GetString(std::string_view path) const { return std::string(GetText(path)); }
  /// The same for as long as the record stays as it is.
  std::string_view GetText(std::string_view path) const;
  std::int64_t GetInt64(std::string_view path) const;
  int GetInt(std::string_view path) const;
  bool GetBool(std::string_view path) const;
  /// Where the word at @p path stands in @p words.
  int GetWord(std::string_view path, std::span<const std::string_view> words) const;
  /// The number of elements of a list.
  std::size_t GetSize(std::string_view path) const;
  Record GetRecord(std::string_view path) const;

  /// Setters make the keys of the path that are missing, and the next element of a list. A text that cannot
  /// be stored is refused.
  void Set(std::string_view path, std::string_view value);
  void Set(std::string_view path, const char* value) { Set(path, std::string_view(value)); }
  void Set(std::string_view path, const std::string& value) { Set(path, std::string_view(value)); }
  void Set(std::string_view path, std::int64_t value);
  void Set(std::string_view path, int value) { Set(path, std::int64_t{value}); }
  void Set(std::string_view path, bool value);
  void Set(std::string_view path, const Record& value);
  /// Adds an element at the end of the list at @p path.
  void Append(std::string_view path, const Record& value);
  void Append(std::string_view path, std::string_view value);
  /// Takes out a key or a list's element; no change where it is missing.
  void Erase(std::string_view path);

  /// All of it, taken apart.
  Json GetJson() const;

 private:
  explicit Record(std::string bytes) : bytes_(std::move(bytes)) {}
  /// Sets @p element to what is at @p path; false where that is nothing.
  bool Find(std::string_view path, bson::Element& element) const;
  bson::Element At(std::string_view path) const;
  void Put(std::string_view path, bson::Type type, std::string_view value);
  /// The path of the element that the list at @p path does not have yet.
  std::string NextOf(std::string_view path) const;

  std::string bytes_;
  /// The place of the member that was found last, or 0.
  mutable std::size_t lastFound_ = 0;
};

}  // namespace store

#pragma GCC visibility pop

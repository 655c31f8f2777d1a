/// The settings of one object: a JSON object behind typed getters and setters.
///
/// A path is a key, or keys and list indices with slashes between: "properties/vendor", "addresses/0/port".
/// Records are stored complete, so a getter that finds nothing, or another type, means a damaged host and
/// throws host::Error; a key that may be missing is asked for with Has first.
#pragma once

#include <cstdint>
#include <memory>
#include <nlohmann/json_fwd.hpp>
#include <span>
#include <string>
#include <string_view>

#pragma GCC visibility push(default)

namespace host {

using Json = nlohmann::ordered_json;

class Record {
 public:
  Record();
  explicit Record(Json json);
  Record(const Record& other);
  Record(Record&& other) noexcept;
  Record& operator=(Record other) noexcept;
  ~Record();

  static Record Parse(const std::string& text);
  std::string Text() const;

  bool Has(std::string_view path) const;
  const std::string& GetString(std::string_view path) const;
  std::int64_t GetInt64(std::string_view path) const;
  int GetInt(std::string_view path) const;
  bool GetBool(std::string_view path) const;
  /// Where the word at @p path stands in @p words.
  int GetWord(std::string_view path, std::span<const std::string_view> words) const;
  /// The number of elements of a list.
  std::size_t GetSize(std::string_view path) const;
  Record GetRecord(std::string_view path) const;

  /// Setters make the keys of the path that are missing. A text that cannot be stored is refused.
  void Set(std::string_view path, std::string_view value);
  void Set(std::string_view path, const char* value) { Set(path, std::string_view(value)); }
  void Set(std::string_view path, const std::string& value) { Set(path, std::string_view(value)); }
  void Set(std::string_view path, std::int64_t value);
  void Set(std::string_view path, int value) { Set(path, std::int64_t{value}); }
  void Set(std::string_view path, bool value);
  void Set(std::string_view path, const Record& value);
  /// Adds an element at the end of the list at @p path.
  void Append(std::string_view path, const Record& value);
  /// Takes out a key or a list's element; no change where it is missing.
  void Erase(std::string_view path);

  const Json& GetJson() const { return *json_; }

 private:
  const Json& At(std::string_view path) const;
  /// Goes ahead of each change.
  void Detach();
  Json& Slot(std::string_view path);

  std::shared_ptr<Json> json_;  // shared with copies of this record until one is changed
};

}  // namespace host

#pragma GCC visibility pop

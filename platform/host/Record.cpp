#include "host/Record.h"

#include <algorithm>
#include <charconv>
#include <limits>
#include <nlohmann/json.hpp>
#include <vector>

#include "host/Error.h"
#include "host/Formats.h"

namespace host {

namespace {

[[noreturn]] void Damaged(std::string_view path, const char* what) {
  throw Error(Error::Kind::Damaged, "a record " + std::string(what) + " at \"" + std::string(path) + "\"");
}

/// The value at @p path below @p json, or null.
const Json* Lookup(const Json* json, std::string_view path) {
  while (json != nullptr && !path.empty()) {
    const std::size_t slash = std::min(path.find('/'), path.size());
    const std::string_view key = path.substr(0, slash);
    path.remove_prefix(std::min(slash + 1, path.size()));
    if (json->is_array()) {
      std::size_t index = 0;
      const auto [end, fault] = std::from_chars(key.data(), key.data() + key.size(), index);
      json = fault == std::errc() && end == key.data() + key.size() && index < json->size() ? &(*json)[index]
                                                                                            : nullptr;
    } else {
      const auto found = json->is_object() ? json->find(std::string(key)) : json->end();
      json = json->is_object() && found != json->end() ? &*found : nullptr;
    }
  }
  return json;
}

/// Builds what the parser reads. The library's own way compares each key with all before it, which takes a
/// third of the time; here a record that has a key twice, as none that was stored has, is found by the first.
class Builder {
 public:
  using Text = Json::string_t;

  explicit Builder(Json& top) : top_(top) {}

  bool null() { return Add(nullptr); }
  bool boolean(bool value) { return Add(value); }
  bool number_integer(Json::number_integer_t value) { return Add(value); }
  bool number_unsigned(Json::number_unsigned_t value) { return Add(value); }
  bool number_float(Json::number_float_t value, const Text&) { return Add(value); }
  bool string(Text& value) { return Add(std::move(value)); }
  bool binary(Json::binary_t&) { return false; }
  bool start_object(std::size_t) { return Open(Json::object()); }
  bool key(Text& value) {
    key_ = std::move(value);
    return true;
  }
  bool end_object() { return Close(); }
  bool start_array(std::size_t) { return Open(Json::array()); }
  bool end_array() { return Close(); }
  bool parse_error(std::size_t, const Text&, const Json::exception&) { return false; }

 private:
  bool Add(Json value) {
    if (open_.empty()) {
      last_ = &(top_ = std::move(value));
    } else if (open_.back()->is_array()) {
      last_ = &open_.back()->emplace_back(std::move(value));
    } else {
      auto& members = open_.back()->get_ref<Json::object_t&>();
      if (members.size() == members.capacity()) members.reserve(members.size() * 4 + 16);
      last_ = &members.emplace_back(std::move(key_), std::move(value)).second;
    }
    return true;
  }
  bool Open(Json value) {
    Add(std::move(value));
    open_.push_back(last_);
    return true;
  }
  bool Close() {
    open_.pop_back();
    return true;
  }

  Json& top_;
  std::vector<Json*> open_;  // each the last element of the one before, so that none is moved while it grows
  Json* last_ = nullptr;
  Text key_;
};

}  // namespace

Record::Record() : json_(std::make_shared<Json>(Json::object())) {}
Record::Record(Json json) : json_(std::make_shared<Json>(std::move(json))) {}
Record::Record(const Record& other) = default;
Record::Record(Record&& other) noexcept = default;
Record& Record::operator=(Record other) noexcept {
  json_.swap(other.json_);
  return *this;
}
Record::~Record() = default;

Record Record::Parse(const std::string& text) {
  Json json;
  Builder builder(json);
  const bool whole = Json::sax_parse(text, &builder);
  if (!whole || !json.is_object()) throw Error(Error::Kind::Damaged, "a record is not a JSON object");
  return Record(std::move(json));
}

std::string Record::Text() const { return json_->dump(); }

bool Record::Has(std::string_view path) const { return Lookup(json_.get(), path) != nullptr; }

const Json& Record::At(std::string_view path) const {
  const Json* json = Lookup(json_.get(), path);
  if (json == nullptr) Damaged(path, "has nothing");
  return *json;
}

void Record::Detach() {
  if (json_.use_count() > 1) json_ = std::make_shared<Json>(*json_);
}

Json& Record::Slot(std::string_view path) {
  Detach();
  const std::size_t slash = path.rfind('/');
  const bool nested = slash != path.npos;
  Json& owner = nested ? Slot(path.substr(0, slash)) : *json_;
  if (owner.is_array()) return const_cast<Json&>(At(path));
  if (!owner.is_object() && !owner.is_null()) Damaged(path, "has no record around what is");
  return owner[std::string(nested ? path.substr(slash + 1) : path)];
}

const std::string& Record::GetString(std::string_view path) const {
  const Json& json = At(path);
  if (!json.is_string()) Damaged(path, "has no text");
  return json.get_ref<const std::string&>();
}

std::int64_t Record::GetInt64(std::string_view path) const {
  const Json& json = At(path);
  if (!json.is_number_integer()) Damaged(path, "has no whole number");
  return json.get<std::int64_t>();
}

int Record::GetInt(std::string_view path) const {
  const std::int64_t value = GetInt64(path);
  using Limits = std::numeric_limits<int>;
  if (value < Limits::min() || value > Limits::max()) Damaged(path, "has a number out of range");
  return static_cast<int>(value);
}

bool Record::GetBool(std::string_view path) const {
  const Json& json = At(path);
  if (!json.is_boolean()) Damaged(path, "has neither true nor false");
  return json.get<bool>();
}

int Record::GetWord(std::string_view path, std::span<const std::string_view> words) const {
  const auto found = std::find(words.begin(), words.end(), GetString(path));
  if (found == words.end()) Damaged(path, "has an unknown word");
  return static_cast<int>(found - words.begin());
}

std::size_t Record::GetSize(std::string_view path) const {
  const Json& json = At(path);
  if (!json.is_array()) Damaged(path, "has no list");
  return json.size();
}

Record Record::GetRecord(std::string_view path) const {
  const Json& json = At(path);
  if (!json.is_object()) Damaged(path, "has no record");
  return Record(json);
}

void Record::Set(std::string_view path, std::string_view value) {
  // The text is not repeated: it may be a secret.
  const std::string fault = StorableFault(value);
  if (!fault.empty()) throw Error(Error::Kind::Refused, "The text for " + Quoted(path) + ' ' + fault + '.');
  Slot(path) = std::string(value);
}

void Record::Set(std::string_view path, std::int64_t value) { Slot(path) = value; }
void Record::Set(std::string_view path, bool value) { Slot(path) = value; }
void Record::Set(std::string_view path, const Record& value) { Slot(path) = *value.json_; }

void Record::Append(std::string_view path, const Record& value) {
  if (!At(path).is_array()) Damaged(path, "has no list");
  Slot(path).push_back(*value.json_);
}

void Record::Erase(std::string_view path) {
  if (!Has(path)) return;
  Detach();
  const std::size_t slash = path.rfind('/');
  const bool nested = slash != path.npos;
  Json& owner = const_cast<Json&>(nested ? At(path.substr(0, slash)) : *json_);
  const std::string key(nested ? path.substr(slash + 1) : path);
  if (owner.is_array()) {
    owner.erase(static_cast<std::size_t>(std::stoul(key)));
  } else {
    owner.erase(key);
  }
}

}  // namespace host

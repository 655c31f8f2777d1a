#include "store/Record.h"

#include <algorithm>
#include <array>
#include <limits>
#include <nlohmann/json.hpp>
#include <optional>

#include "store/Bson.h"
#include "store/Error.h"
#include "store/Text.h"

namespace store {

namespace {

using bson::Cursor;
using bson::Element;
using bson::Type;

constexpr int kMostDepth = 16;  // twice that of any kind of object

[[noreturn]] void Damaged(std::string_view path, const char* what) {
  throw Error(Error::Kind::Damaged, "a record " + std::string(what) + " at \"" + std::string(path) + "\"");
}

[[noreturn]] void TooDeep() { throw Error(Error::Kind::Damaged, "a record is nested too deeply"); }

bool HoldsElements(Type type) { return type == Type::Document || type == Type::Array; }

/// Sets @p element to that of @p key in the document at @p document; false where there is none.
bool FindMember(std::string_view bytes, std::size_t document, std::string_view key, Element& element) {
  Cursor cursor(bytes, document);
  return cursor.Find(key, cursor.End(), element);
}

/// The same of a whole record, from @p place on, which becomes that of the element: most keys are asked for
/// in the order in which they are stored.
bool FindMemberFrom(std::size_t& place, std::string_view bytes, std::string_view key, Element& element) {
  Cursor cursor(bytes, 0);
  const std::size_t begin = cursor.Place();
  const std::size_t middle = std::max(begin, place);
  cursor.GoTo(middle);
  if (!cursor.Find(key, cursor.End(), element)) {
    cursor.GoTo(begin);
    if (!cursor.Find(key, middle, element)) return false;
  }
  place = element.begin;
  return true;
}

/// Takes the first part off @p path.
std::string_view FirstOf(std::string_view& path) {
  const std::size_t slash = std::min(path.find('/'), path.size());
  const std::string_view first = path.substr(0, slash);
  path.remove_prefix(std::min(slash + 1, path.size()));
  return first;
}

/// How far a path leads.
struct Way {
  Way() { documents[0] = 0; }  // the rest is set as it is come through

  std::array<std::size_t, kMostDepth> documents;  // those that it goes through, the outermost first
  std::size_t depth = 1;                          // how many they are
  bool inArray = false;                           // the last one is an array
  std::string_view key;                           // in that one
  std::optional<Element> element;                 // what the key has there
  std::string_view rest;                          // of the path, below the key

  bool IsFound() const { return element && rest.empty(); }
};

Way WayTo(std::string_view bytes, std::string_view path) {
  Way way;
  for (;;) {
    way.key = FirstOf(path);
    way.element.emplace();
    if (!FindMember(bytes, way.documents[way.depth - 1], way.key, *way.element)) way.element.reset();
    way.rest = path;
    if (path.empty() || !way.element || !HoldsElements(way.element->type)) return way;
    if (way.depth == kMostDepth) TooDeep();
    way.documents[way.depth++] = way.element->value;
    way.inArray = way.element->type == Type::Array;
  }
}

/// Puts @p text in the place of the bytes from @p begin to @p end, all inside the documents of @p way.
void Splice(std::string& bytes, const Way& way, std::size_t begin, std::size_t end, std::string_view text) {
  const std::size_t before = bytes.size();
  bytes.replace(begin, end - begin, text);
  for (std::size_t i = 0; i < way.depth; ++i) {
    const std::size_t place = way.documents[i];
    const std::size_t size = static_cast<std::size_t>(bson::Int32At(bytes, place)) + bytes.size() - before;
    bytes.replace(place, sizeof(std::int32_t), bson::Number32(static_cast<std::int32_t>(size)));
  }
}

std::size_t CountOf(std::string_view bytes, std::size_t document) {
  std::size_t count = 0;
  Cursor cursor(bytes, document);
  for (Element element; cursor.Next(element);) ++count;
  return count;
}

std::string TextValue(std::string_view path, std::string_view value) {
  // The text is not repeated: it may be a secret.
  const std::string fault = StorableFault(value);
  if (!fault.empty()) throw Error(Error::Kind::Invalid, "The text for " + Quoted(path) + ' ' + fault + '.');
  return bson::Text(value);
}

bool BooleanAt(std::string_view bytes, const Element& element) { return bytes[element.value] != '\0'; }

Json JsonOf(std::string_view bytes, std::size_t document, bool isArray, int depth) {
  if (depth > kMostDepth) TooDeep();
  Json json = isArray ? Json::array() : Json::object();
  Cursor cursor(bytes, document);
  for (Element element; cursor.Next(element);) {
    Json value;
    switch (element.type) {
      case Type::Text:
        value = std::string(bson::TextOf(bytes, element));
        if (!IsUtf8(value.get_ref<const std::string&>())) Damaged(element.key, "has no text");
        break;
      case Type::Document:
      case Type::Array:
        value = JsonOf(bytes, element.value, element.type == Type::Array, depth + 1);
        break;
      case Type::Boolean:
        value = BooleanAt(bytes, element);
        break;
      case Type::Null:
        break;
      case Type::Int32:
        value = bson::Int32At(bytes, element.value);
        break;
      case Type::Int64:
        value = bson::Int64At(bytes, element.value);
        break;
      case Type::Double:
        Damaged(element.key, "has no whole number");
    }
    if (isArray) {
      json.push_back(std::move(value));
    } else {
      if (!IsUtf8(element.key)) bson::Damaged();
      json.emplace(std::string(element.key), std::move(value));
    }
  }
  return json;
}

}  // namespace

Record::Record() : bytes_(bson::Document({})) {}

Record::Record(const Json& json) { Json::to_bson(json, bytes_); }

Record Record::Stored(std::string_view bytes) {
  Record record{std::string()};
  record.Restore(bytes);
  return record;
}

void Record::Restore(std::string_view bytes) {
  if (Cursor(bytes, 0).End() + 1 != bytes.size()) bson::Damaged();
  bytes_ = bytes;
  lastFound_ = 0;
}

Json Record::GetJson() const { return JsonOf(bytes_, 0, false, 1); }

bool Record::Find(std::string_view path, Element& element) const {
  if (!FindMemberFrom(lastFound_, bytes_, FirstOf(path), element)) return false;
  for (std::size_t depth = 1; !path.empty(); ++depth) {
    if (!HoldsElements(element.type)) return false;
    if (depth == kMostDepth) TooDeep();
    if (!FindMember(bytes_, element.value, FirstOf(path), element)) return false;
  }
  return true;
}

Element Record::At(std::string_view path) const {
  Element element;
  if (!Find(path, element)) Damaged(path, "has nothing");
  return element;
}

bool Record::Has(std::string_view path) const {
  Element element;
  return Find(path, element);
}

std::string_view Record::GetText(std::string_view path) const {
  const Element element = At(path);
  if (element.type != Type::Text) Damaged(path, "has no text");
  const std::string_view text = bson::TextOf(bytes_, element);
  if (!IsUtf8(text)) Damaged(path, "has no text");
  return text;
}

std::int64_t Record::GetInt64(std::string_view path) const {
  const Element element = At(path);
  if (element.type == Type::Int32) return bson::Int32At(bytes_, element.value);
  if (element.type != Type::Int64) Damaged(path, "has no whole number");
  return bson::Int64At(bytes_, element.value);
}

int Record::GetInt(std::string_view path) const {
  const std::int64_t value = GetInt64(path);
  using Limits = std::numeric_limits<int>;
  if (value < Limits::min() || value > Limits::max()) Damaged(path, "has a number out of range");
  return static_cast<int>(value);
}

bool Record::GetBool(std::string_view path) const {
  const Element element = At(path);
  if (element.type != Type::Boolean) Damaged(path, "has neither true nor false");
  return BooleanAt(bytes_, element);
}

int Record::GetWord(std::string_view path, std::span<const std::string_view> words) const {
  const auto found = std::find(words.begin(), words.end(), GetText(path));
  if (found == words.end()) Damaged(path, "has an unknown word");
  return static_cast<int>(found - words.begin());
}

std::size_t Record::GetSize(std::string_view path) const {
  const Element list = At(path);
  if (list.type != Type::Array) Damaged(path, "has no list");
  return CountOf(bytes_, list.value);
}

Record Record::GetRecord(std::string_view path) const {
  const Element element = At(path);
  if (element.type != Type::Document) Damaged(path, "has no record");
  return Record(bytes_.substr(element.value, element.end - element.value));
}

void Record::Put(std::string_view path, Type type, std::string_view value) {
  lastFound_ = 0;
  const Way way = WayTo(bytes_, path);
  const std::size_t document = way.documents[way.depth - 1];
  if (!way.element && way.inArray && way.key != std::to_string(CountOf(bytes_, document))) {
    Damaged(path, "has nothing");
  }
  if (way.element && !way.rest.empty() && way.element->type != Type::Null) {
    Damaged(path, "has no record around what is");
  }
  // The records around the value that are not there yet, from within.
  std::string made(value);
  for (std::string_view rest = way.rest; !rest.empty();) {
    const std::size_t slash = rest.rfind('/');
    made = bson::Document(bson::ElementOf(type, rest.substr(slash + 1), made));
    type = Type::Document;
    rest = slash == rest.npos ? std::string_view() : rest.substr(0, slash);
  }
  const std::size_t end = Cursor(bytes_, document).End();
  Splice(bytes_, way, way.element ? way.element->begin : end, way.element ? way.element->end : end,
         bson::ElementOf(type, way.key, made));
}

void Record::Set(std::string_view path, std::string_view value) {
  Put(path, Type::Text, TextValue(path, value));
}

void Record::Set(std::string_view path, std::int64_t value) {
  if (value == static_cast<std::int32_t>(value)) {
    Put(path, Type::Int32, bson::Number32(static_cast<std::int32_t>(value)));
  } else {
    Put(path, Type::Int64, bson::Number64(value));
  }
}

void Record::Set(std::string_view path, bool value) {
  Put(path, Type::Boolean, std::string_view(value ? "\1" : "\0", 1));
}

void Record::Set(std::string_view path, const Record& value) { Put(path, Type::Document, value.bytes_); }

void Record::Append(std::string_view path, const Record& value) { Set(NextOf(path), value); }
void Record::Append(std::string_view path, std::string_view value) { Set(NextOf(path), value); }

std::string Record::NextOf(std::string_view path) const {
  return std::string(path) + '/' + std::to_string(GetSize(path));
}

void Record::Erase(std::string_view path) {
  const Way way = WayTo(bytes_, path);
  if (!way.IsFound()) return;
  lastFound_ = 0;
  std::size_t end = way.element->end;
  std::string moved;
  if (way.inArray) {
    std::size_t number = 0;
    Cursor cursor(bytes_, way.documents[way.depth - 1]);
    for (Element element; cursor.Next(element);) {
      if (element.begin == way.element->begin) continue;
      const std::string key = std::to_string(number++);
      if (element.begin < end) continue;
      moved += bson::ElementOf(element.type, key, bytes_.substr(element.value, element.end - element.value));
    }
    end = cursor.End();
  }
  Splice(bytes_, way, way.element->begin, end, moved);
}

}  // namespace store

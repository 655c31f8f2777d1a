#include "store/Bson.h"

#include <bit>
#include <cstring>
#include <limits>

#include "store/Error.h"

namespace store::bson {

// The numbers of the format have their least byte first, and are copied as they are.
static_assert(std::endian::native == std::endian::little);

namespace {

constexpr std::size_t kLength = sizeof(std::int32_t);
constexpr std::size_t kLeast = kLength + 1;  // of a document, of which the last byte is 0

template <class Number>
Number NumberAt(std::string_view bytes, std::size_t place) {
  Number number;
  std::memcpy(&number, bytes.data() + place, sizeof number);
  return number;
}

template <class Number>
std::string BytesOf(Number number) {
  return std::string(reinterpret_cast<const char*>(&number), sizeof number);
}

std::int32_t Length(std::size_t size) {
  // The database takes no larger values either.
  if (size > std::numeric_limits<std::int32_t>::max()) {
    throw Error(Error::Kind::TooMany, "A record has become too large.");
  }
  return static_cast<std::int32_t>(size);
}

/// The size that stands at @p place: what it counts, ends with a zero ahead of @p end.
std::size_t SizeAt(std::string_view bytes, std::size_t place, std::size_t end, std::size_t from,
                   std::size_t least) {
  if (end - place < kLength) Damaged();
  const std::int32_t size = Int32At(bytes, place);
  if (size < 0 || static_cast<std::size_t>(size) < least || static_cast<std::size_t>(size) > end - from) {
    Damaged();
  }
  if (bytes[from + static_cast<std::size_t>(size) - 1] != '\0') Damaged();
  return static_cast<std::size_t>(size);
}

/// The element at @p begin of a document whose elements end at @p end.
inline Element ElementAt(std::string_view bytes, std::size_t begin, std::size_t end) {
  Element element{.type = static_cast<Type>(bytes[begin]), .key = {}, .begin = begin};
  const char* const key = bytes.data() + begin + 1;
  const std::size_t length = std::strlen(key);  // there is a zero behind the last element, too
  element.key = {key, length};
  element.value = begin + 1 + length + 1;
  if (element.value > end) Damaged();
  std::size_t size = 0;
  switch (element.type) {
    case Type::Text:
      size = kLength + SizeAt(bytes, element.value, end, element.value + kLength, 1);
      break;
    case Type::Document:
    case Type::Array:
      size = SizeAt(bytes, element.value, end, element.value, kLeast);
      break;
    case Type::Boolean:
      size = 1;
      break;
    case Type::Null:
      break;
    case Type::Int32:
      size = sizeof(std::int32_t);
      break;
    case Type::Double:
    case Type::Int64:
      size = sizeof(std::int64_t);
      break;
    default:
      Damaged();
  }
  if (size > end - element.value) Damaged();
  element.end = element.value + size;
  return element;
}

}  // namespace

void Damaged() { throw Error(Error::Kind::Damaged, "a record is not a BSON document"); }

Cursor::Cursor(std::string_view bytes, std::size_t document) : bytes_(bytes), next_(document + kLength) {
  end_ = document + SizeAt(bytes, document, bytes.size(), document, kLeast) - 1;
}

bool Cursor::Next(Element& element) {
  if (next_ == end_) return false;
  element = ElementAt(bytes_, next_, end_);
  next_ = element.end;
  return true;
}

bool Cursor::Find(std::string_view key, std::size_t end, Element& element) {
  while (next_ != end) {
    const Element here = ElementAt(bytes_, next_, end_);
    next_ = here.end;
    // Without a call for those of another length, which most are.
    if (here.key.size() == key.size() && here.key == key) {
      element = here;
      return true;
    }
  }
  return false;
}

std::int32_t Int32At(std::string_view bytes, std::size_t place) {
  return NumberAt<std::int32_t>(bytes, place);
}
std::int64_t Int64At(std::string_view bytes, std::size_t place) {
  return NumberAt<std::int64_t>(bytes, place);
}

std::string_view TextOf(std::string_view bytes, const Element& element) {
  const std::size_t begin = element.value + kLength;
  return bytes.substr(begin, element.end - 1 - begin);
}

std::string Number32(std::int32_t number) { return BytesOf(number); }
std::string Number64(std::int64_t number) { return BytesOf(number); }

std::string Text(std::string_view text) {
  return Number32(Length(text.size() + 1)).append(text).append(1, '\0');
}

std::string Document(std::string_view elements) {
  return Number32(Length(elements.size() + kLeast)).append(elements).append(1, '\0');
}

std::string ElementOf(Type type, std::string_view key, std::string_view value) {
  return std::string(1, static_cast<char>(type)).append(key).append(1, '\0').append(value);
}

void AppendElement(std::string& bytes, Type type, std::string_view key, std::string_view value) {
  bytes += static_cast<char>(type);
  bytes.append(key).append(1, '\0').append(value);
}

void AppendText(std::string& bytes, std::string_view text) {
  bytes.append(Number32(Length(text.size() + 1))).append(text).append(1, '\0');
}

Type AppendNumber(std::string& bytes, std::int64_t number) {
  using Limits = std::numeric_limits<std::int32_t>;
  const bool isShort = number >= Limits::min() && number <= Limits::max();
  bytes += isShort ? Number32(static_cast<std::int32_t>(number)) : Number64(number);
  return isShort ? Type::Int32 : Type::Int64;
}

void BeginDocument(std::string& bytes) { bytes.append(kLength, '\0'); }

void EndDocument(std::string& bytes) {
  bytes += '\0';
  bytes.replace(0, kLength, Number32(Length(bytes.size())));
}

}  // namespace store::bson

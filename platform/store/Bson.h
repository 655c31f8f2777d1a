/// BSON (bsonspec.org, version 1.1), the binary form of JSON in which records are stored: each element tells
/// its size, so that one is found without looking into those in front of it.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace store::bson {

/// The types that records have; there are more, and their numbers are free.
enum class Type : unsigned char {
  Double = 0x01,
  Text = 0x02,
  Document = 0x03,
  Array = 0x04,
  Boolean = 0x08,
  Null = 0x0a,
  Int32 = 0x10,
  Int64 = 0x12,
};

/// One element of a document. Places are counted from the beginning of the bytes that it stands in.
struct Element {
  Type type = Type::Null;
  std::string_view key;  // of an array its elements' numbers, from "0"
  std::size_t begin = 0;
  std::size_t value = 0;
  std::size_t end = 0;
};

/// Walks through the elements of the document or array that begins at @p document. No byte is taken on trust:
/// what is no BSON, or of a type that records do not have, is an Error (Damaged).
class Cursor {
 public:
  Cursor(std::string_view bytes, std::size_t document);
  /// Goes on to the next element; false behind the last one.
  bool Next(Element& element);
  /// Goes on behind the element of @p key, where it is one of those up to @p end; false where it is not.
  bool Find(std::string_view key, std::size_t end, Element& element);
  /// The place of the element that comes next.
  std::size_t Place() const { return next_; }
  /// Goes to @p place, where an element of the document begins.
  void GoTo(std::size_t place) { next_ = place; }
  /// The place behind the last element.
  std::size_t End() const { return end_; }

 private:
  std::string_view bytes_;
  std::size_t next_;
  std::size_t end_;
};

/// The number at @p place, of which the bytes are there.
std::int32_t Int32At(std::string_view bytes, std::size_t place);
std::int64_t Int64At(std::string_view bytes, std::size_t place);
/// The text that @p element is.
std::string_view TextOf(std::string_view bytes, const Element& element);

// Values as they stand behind a key.
std::string Number32(std::int32_t number);
std::string Number64(std::int64_t number);
std::string Text(std::string_view text);
/// A document, or an array, of @p elements one behind the other.
std::string Document(std::string_view elements);
std::string ElementOf(Type type, std::string_view key, std::string_view value);

/// The same at the end of @p bytes, which keep the room that they have.
void AppendElement(std::string& bytes, Type type, std::string_view key, std::string_view value);
void AppendText(std::string& bytes, std::string_view text);
/// The smaller form that holds the number; returns which that is.
Type AppendNumber(std::string& bytes, std::int64_t number);
/// Between the two, what is appended is an element of the document.
void BeginDocument(std::string& bytes);
/// @p bytes are the document alone.
void EndDocument(std::string& bytes);

[[noreturn]] void Damaged();

}  // namespace store::bson

/// What a document is held against: the schema, value by value, and what its objects say of each other.
#pragma once

#include <cstdint>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <variant>

#include "store/Document.h"

namespace store {

/// A value that is no object or list. A number that is not whole, or beyond 64 bits, is a double.
using Scalar = std::variant<std::monostate, bool, std::int64_t, double, std::string_view>;

/// A number as a scalar: beyond 63 bits it is a double.
Scalar Whole(std::uint64_t number);

inline constexpr const char* kNoObject = "expected an object in braces";
inline constexpr const char* kNoList = "expected a list";

/// What is wrong with a document, and where: @p offset counts the bytes in front of it. @p text may be
/// empty where @p path says all.
struct Fault : std::runtime_error {
  Fault(std::size_t place, const std::string& path, const std::string& text)
      : std::runtime_error(path.empty() || text.empty() ? path + text : path + ": " + text), offset(place) {}
  std::size_t offset;
};

/// The path of @p key in what has the path @p path, or of the element @p index.
std::string Below(const std::string& path, std::string_view key);
std::string Element(const std::string& path, std::size_t index);
/// The path of the object with the number @p object.
std::string PathOf(const Document& document, std::size_t object);

/// A record that holds a secret, or nothing but records that do: what stands in the place of a key there may
/// be a secret itself.
bool IsForSecrets(std::span<const Key> keys);
/// What @p key takes, as "expected a text".
std::string Expected(const Key& key);
/// What is wrong with @p value; empty when nothing is.
std::string ValueFault(const Key& key, const Scalar& value);
/// What a key that is no record or list has where nothing was written.
Scalar DefaultOf(const Key& key);

// Each throws a Fault.

/// Holds the object with the number @p object against itself, and what is below it against it.
void RequireRight(const Document& document, std::size_t object);
/// For an object whose @p name is empty, or that of the object at @p place of the same list.
[[noreturn]] void RefuseName(const Document& document, std::size_t object, const std::string& name,
                             std::size_t place);

}  // namespace store

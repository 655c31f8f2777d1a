/// In which words a schema is written: what kinds of objects there are, and the keys of each. It is one
/// table, which checks, documents and the field list of the documentation follow.
#pragma once

#include <cstdint>
#include <limits>
#include <span>
#include <string>
#include <string_view>

#include "store/Record.h"

#pragma GCC visibility push(default)

namespace store {

/// The kinds that there are, and their numbers, are told by those above.
enum class Kind : int;

enum class Type : std::uint8_t { Text, Integer, Boolean, Word, Record, List };

/// One key of a record. A key is optional to write unless Required; what is not written gets its default when
/// the description is loaded, except for Optional keys, which stay away.
struct Key {
  std::string_view name;
  Type type = Type::Text;
  std::string_view help = {};
  std::int64_t number = 0;     // default of an Integer, or of a Boolean
  std::string_view text = {};  // default of a Text or a Word
  std::int64_t least = 0;
  std::int64_t most = 0;
  std::span<const std::string_view> words = {};
  std::span<const Key> keys = {};                    // of a Record; of a List the one element
  std::string (*fault)(std::string_view) = nullptr;  // what is wrong with a text, empty when nothing is
  bool required = false;
  bool optional = false;
  bool secret = false;
  bool folded = false;   // upper and lower case make no difference to a name that it is a part of
  bool partial = false;  // a Record that holds only what was written; a null stands for an Optional key to go

  template <class Value>
  constexpr Key With(Value Key::*member, Value value) const {
    Key key = *this;
    key.*member = value;
    return key;
  }

  constexpr Key Default(std::int64_t value) const { return With(&Key::number, value); }
  constexpr Key Default(std::string_view value) const { return With(&Key::text, value); }
  constexpr Key Required() const { return With(&Key::required, true); }
  constexpr Key Optional() const { return With(&Key::optional, true); }
  constexpr Key Folded() const { return With(&Key::folded, true); }
  constexpr Key Secret() const { return With(&Key::secret, true); }
  constexpr Key Partial() const { return With(&Key::partial, true).Optional(); }
};

constexpr Key Text(std::string_view name, std::string_view help,
                   std::string (*fault)(std::string_view) = nullptr) {
  return Key{.name = name, .type = Type::Text, .help = help, .fault = fault};
}
constexpr Key Integer(std::string_view name, std::string_view help,
                      std::int64_t least = std::numeric_limits<std::int32_t>::min(),
                      std::int64_t most = std::numeric_limits<std::int32_t>::max()) {
  return Key{.name = name, .type = Type::Integer, .help = help, .least = least, .most = most};
}
constexpr Key Boolean(std::string_view name, std::string_view help, bool value = false) {
  return Key{.name = name, .type = Type::Boolean, .help = help, .number = value};
}
/// The first word is the default.
constexpr Key Word(std::string_view name, std::string_view help, std::span<const std::string_view> words) {
  return Key{.name = name, .type = Type::Word, .help = help, .text = words[0], .words = words};
}
constexpr Key Nested(std::string_view name, std::string_view help, std::span<const Key> keys) {
  return Key{.name = name, .type = Type::Record, .help = help, .keys = keys};
}
/// @p element is a span of one key, of which the name is not used.
constexpr Key List(std::string_view name, std::string_view help, std::span<const Key> element) {
  return Key{.name = name, .type = Type::List, .help = help, .keys = element};
}

/// The key of that name, or null.
constexpr const Key* FindKey(std::span<const Key> keys, std::string_view name) {
  for (const Key& key : keys) {
    if (key.name == name) return &key;
  }
  return nullptr;
}

/// A list of objects below another: the key in the description and their kind.
struct Collection {
  std::string_view key;
  Kind kind;
  std::string_view help;
};

struct KindSpec {
  Kind kind;
  std::string_view word;  // as in "adapter"
  std::span<const Key> keys;
  std::span<const Collection> collections;
  /// The keys of which the object's name is made, with a blank between; none for objects without unique
  /// names.
  std::span<const std::string_view> nameKeys;
  /// What is wrong with a whole record, as "KEY: TEXT"; empty when nothing is.
  std::string (*fault)(const Record&) = nullptr;
  /// The same of a record that a description puts below the record @p parent.
  std::string (*faultBelow)(const Record& record, const Record& parent) = nullptr;
};

/// Makes @p kinds the schema, ahead of all else, and for as long as the process lives. The first is the kind
/// of the object above all others.
void SetSchema(std::span<const KindSpec> kinds);

const KindSpec& GetKindSpec(Kind kind);
Kind RootKind();
/// The name that an object with this record has among its siblings; empty where the kind has none.
std::string NameOf(Kind kind, const Record& record);
/// All kinds and keys, as the tables of the documentation.
std::string SchemaTables();

}  // namespace store

#pragma GCC visibility pop

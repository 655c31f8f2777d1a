/// Reads documents: each object is held against the schema while it is read.
#pragma once

#include <cstddef>
#include <deque>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "store/Bson.h"
#include "store/Document.h"
#include "store/DocumentChecks.h"

namespace store {

/// Puts the values of a document, as they come, into the records that they belong to. What is wrong is
/// refused where it stands, as a Fault, so nothing is kept that is no part of a host.
class DocumentReader {
 public:
  /// Reads one object of the kind @p top, with those below it.
  explicit DocumentReader(Kind top) : top_(top) {}

  /// Where in the text what follows begins.
  void MoveTo(std::size_t offset) { offset_ = offset; }
  std::size_t Offset() const { return offset_; }

  void BeginObject();
  void Name(std::string_view key);
  void EndObject();
  void BeginList();
  void EndList();
  void Value(const Scalar& value);
  [[noreturn]] void Refuse(const std::string& text) const;

  /// What was read, once all of it was.
  Document Take() { return std::move(objects_); }

 private:
  static constexpr std::size_t kNone = static_cast<std::size_t>(-1);

  /// What a key has, in the form in which it is stored.
  struct Slot {
    bool given = false;
    bson::Type type = bson::Type::Null;
    std::string bytes = {};
  };

  /// A record whose end is not reached, or a list of values, or one of objects.
  struct Level {
    enum class Shape { Record, List, Objects } shape = Shape::Record;
    /// Of a record, all that it can have; of a list, the one of its elements.
    std::span<const Key> keys = {};
    /// The kind of an object, or of those in the list; null for what is a part of an object.
    const KindSpec* spec = nullptr;
    /// What was not written stays away.
    bool partial = false;
    /// Of a record, what each key has, and behind those whether each list of objects was there.
    std::vector<Slot> slots = {};
    /// Of a record or a list of values, what there is of it in its stored form.
    std::string document = {};
    /// Of a record, where the key that was read last stands among them.
    std::size_t current = kNone;
    /// Of a record, where its brace stands in the text.
    std::size_t offset = 0;
    /// The number of an object.
    std::size_t object = 0;
    /// Of a list: the elements that are complete, and, of objects, the hash of each name. 100,000 of them are
    /// sorted in a tenth of the time that a table of the names would take.
    std::size_t count = 0;
    std::vector<std::size_t> names = {};

    /// How many slots a record has. There may be more, for the room that they have.
    std::size_t Size() const { return keys.size() + (spec == nullptr ? 0 : spec->collections.size()); }
    /// What a record's value at @p place is called.
    std::string_view NameOf(std::size_t place) const {
      return place < keys.size() ? keys[place].name : spec->collections[place - keys.size()].key;
    }
  };

  Level& Top() { return levels_[depth_ - 1]; }
  Level& Push(Level::Shape shape, std::span<const Key> keys, const KindSpec* spec);
  void Pop() { --depth_; }
  const Key* KeyInTurn();
  void Put(const Scalar& value);
  void Put(bson::Type type, std::string_view bytes);
  void BeginObjectOf(Kind kind);
  void BeginRecord(const Key& key);
  void EndRecord();
  void PutDefault(const Key& key);
  void PutTop(bson::Type type);
  void Complete();
  /// An Error where two objects of the list have one name.
  void RequireOwnNames(Level& list) const;
  std::string Path() const;

  Kind top_;
  Document objects_;
  std::deque<Level> levels_;  // those that are left stay, to be used again
  std::size_t depth_ = 0;
  std::string bytes_;  // of a value that is put, for its room
  std::size_t settings_ = 0;
  std::size_t offset_ = 0;
};

}  // namespace store

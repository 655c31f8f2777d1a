/// The objects of a store, as one operation sees and changes them.
#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "store/Record.h"
#include "store/Schema.h"
#include "store/Store.h"

#pragma GCC visibility push(default)

namespace store {

/// The object above all others: the host itself.
inline constexpr std::int64_t kRoot = 1;

/// A copy of one object.
struct Object {
  std::int64_t id = 0;  // never used again once the object is gone
  std::int64_t parent = 0;
  Kind kind{};
  std::string name;  // unique among the siblings of its kind; empty for kinds without names
  Record record;
};

class Tree {
 public:
  explicit Tree(Store& store) : store_(store) {}
  Tree(const Tree&) = delete;
  Tree& operator=(const Tree&) = delete;
  virtual ~Tree() = default;

  /// The object @p id; an Error (NotFound) where there is none, (WrongObject) where it is of another kind.
  Object Get(std::int64_t id, Kind kind);
  virtual std::optional<Object> Lookup(std::int64_t id);
  /// The same as Get without a copy, for walks: it stays until the next See, or a change. Who goes from one
  /// object to the next in their order has them read ahead.
  const Object& See(std::int64_t id, Kind kind);
  /// The same of any kind; null where there is none.
  virtual const Object* Look(std::int64_t id);
  /// The child of that name (see NameOf), if there is one.
  virtual std::optional<Object> Find(std::int64_t parent, Kind kind, std::string_view name);
  /// In order of place.
  virtual std::vector<Object> Children(std::int64_t parent, Kind kind);
  virtual std::vector<std::int64_t> ChildIds(std::int64_t parent, Kind kind);
  /// Shows the id and the record of each to @p visit, which asks for no others of that kind.
  virtual void ForEachChild(std::int64_t parent, Kind kind,
                            const std::function<void(std::int64_t id, const Record& record)>& visit);
  /// The closest object of @p kind at or above the object @p id, if there is one.
  std::optional<Object> Above(std::int64_t id, Kind kind);

  /// Adds an object behind its siblings. Its name follows from the record; one that is taken is an Error
  /// (Exists).
  virtual Object Insert(std::int64_t parent, Kind kind, Record record);
  /// The same where the name is known; returns the id.
  virtual std::int64_t Add(std::int64_t parent, Kind kind, std::string_view name, const Record& record);
  /// Adds an object with every key at its default, except for those in @p given.
  Object InsertNew(std::int64_t parent, Kind kind, const Record& given);
  /// Writes the record of @p object, and its name with it.
  virtual void Update(const Object& object);
  /// Removes all objects, the host's own too. Their ids are not used again either, but for that one.
  void Clear();
  /// Removes the object and all that is below it.
  virtual void Remove(std::int64_t id);

  Store& GetStore() { return store_; }

 private:
  /// The object @p id where it was read ahead, in the state that the store is in.
  const Object* Seen(std::int64_t id) const;
  void ReadAhead(std::int64_t id);

  Store& store_;
  std::vector<Object> ahead_;     // in the order of their ids; its members keep their memory
  std::size_t aheadCount_ = 0;    // how many of them were read
  mutable std::size_t seen_ = 0;  // the one that was asked for last
  std::uint64_t aheadState_ = 0;  // of the store, when they were read
  std::int64_t reach_ = 1;        // how many are read at a time
};

}  // namespace store

#pragma GCC visibility pop

#include "store/Tree.h"

#include <algorithm>

#include "store/Document.h"
#include "store/Error.h"
#include "store/Text.h"

namespace store {

namespace {

/// Makes @p object what the row says, in the memory that it has.
void ReadRow(const Statement& row, Object& object) {
  object.id = row.GetInt(0);
  object.parent = row.GetInt(1);
  // Ids are never used again, so what is made below another object has the greater one. Where that does not
  // hold the way up would have no end.
  if (object.parent >= object.id) {
    throw Error(Error::Kind::Damaged, "an object is not below an older one");
  }
  object.kind = static_cast<Kind>(row.GetInt(2));
  object.name = row.GetText(3);
  if (!IsUtf8(object.name)) throw Error(Error::Kind::Damaged, "the name of an object is not UTF-8");
  object.record.Restore(row.GetBytes(4));
}

Object Row(const Statement& row) {
  Object object;
  ReadRow(row, object);
  return object;
}

std::optional<Object> OneRow(Statement& statement) {
  if (!statement.Step()) return {};
  return Row(statement);
}

void BindName(Statement& statement, std::string_view name) {
  if (name.empty()) {
    statement.BindNull();  // nulls are all different to a unique index
  } else {
    statement.Bind(name);
  }
}

/// An Error where the object is not there, or of another kind.
void Require(const Object* object, Kind kind) {
  if (object != nullptr && object->kind == kind) return;
  if (kind == RootKind()) throw Error(Error::Kind::Damaged, "the object of the host itself is missing");
  const std::string word(GetKindSpec(kind).word);
  if (object == nullptr) throw Error(Error::Kind::NotFound, "The " + word + " is gone.");
  throw Error(Error::Kind::WrongObject, "The object is no " + word + ".");
}

std::int64_t Number(Kind kind) { return static_cast<std::int64_t>(kind); }

}  // namespace

std::optional<Object> Tree::Lookup(std::int64_t id) {
  if (const Object* seen = Seen(id)) return *seen;
  Statement statement(store_, "SELECT id, parent, kind, name, record FROM object WHERE id = ?");
  return OneRow(statement.Bind(id));
}

const Object* Tree::Seen(std::int64_t id) const {
  if (aheadState_ != store_.GetState()) return nullptr;
  for (const std::size_t at : {seen_, seen_ + 1}) {  // where a walk looks
    if (at < aheadCount_ && ahead_[at].id == id) return &ahead_[seen_ = at];
  }
  const auto end = ahead_.begin() + static_cast<std::ptrdiff_t>(aheadCount_);
  const auto found = std::lower_bound(ahead_.begin(), end, id,
                                      [](const Object& object, std::int64_t to) { return object.id < to; });
  if (found == end || found->id != id) return nullptr;
  return &ahead_[seen_ = static_cast<std::size_t>(found - ahead_.begin())];
}

void Tree::ReadAhead(std::int64_t id) {
  constexpr std::int64_t kFurthest = 64;
  const std::int64_t last = aheadCount_ == 0 ? 0 : ahead_[aheadCount_ - 1].id;
  const bool isNext =
      aheadCount_ > 0 && aheadState_ == store_.GetState() && id > last && id - last < kFurthest;
  reach_ = isNext ? std::min(reach_ * 2, kFurthest) : 1;
  aheadCount_ = seen_ = 0;
  aheadState_ = store_.GetState();
  Statement statement(store_,
                      "SELECT id, parent, kind, name, record FROM object WHERE id >= ? ORDER BY id LIMIT ?");
  statement.Bind(id).Bind(reach_);
  try {
    for (; statement.Step(); ++aheadCount_) {
      if (aheadCount_ == ahead_.size()) ahead_.emplace_back();
      ReadRow(statement, ahead_[aheadCount_]);
    }
  } catch (const Error&) {
    if (aheadCount_ == 0) throw;  // another than the one that is asked for will be told of when it is
  }
}

Object Tree::Get(std::int64_t id, Kind kind) {
  std::optional<Object> object = Lookup(id);
  Require(object ? &*object : nullptr, kind);
  return *std::move(object);
}

const Object* Tree::Look(std::int64_t id) {
  if (const Object* seen = Seen(id)) return seen;
  ReadAhead(id);
  return Seen(id);
}

const Object& Tree::See(std::int64_t id, Kind kind) {
  const Object* const seen = Look(id);
  Require(seen, kind);
  return *seen;
}

std::optional<Object> Tree::Find(std::int64_t parent, Kind kind, std::string_view name) {
  Statement statement(
      store_, "SELECT id, parent, kind, name, record FROM object WHERE parent = ? AND kind = ? AND name = ?");
  return OneRow(statement.Bind(parent).Bind(Number(kind)).Bind(name));
}

std::vector<Object> Tree::Children(std::int64_t parent, Kind kind) {
  Statement statement(
      store_, "SELECT id, parent, kind, name, record FROM object WHERE parent = ? AND kind = ? ORDER BY id");
  statement.Bind(parent).Bind(Number(kind));
  std::vector<Object> children;
  while (statement.Step()) children.push_back(Row(statement));
  return children;
}

void Tree::ForEachChild(std::int64_t parent, Kind kind,
                        const std::function<void(std::int64_t id, const Record& record)>& visit) {
  Statement statement(store_, "SELECT id, record FROM object WHERE parent = ? AND kind = ? ORDER BY id");
  statement.Bind(parent).Bind(Number(kind));
  Record record;
  while (statement.Step()) {
    record.Restore(statement.GetBytes(1));
    visit(statement.GetInt(0), record);
  }
}

std::vector<std::int64_t> Tree::ChildIds(std::int64_t parent, Kind kind) {
  Statement statement(store_, "SELECT id FROM object WHERE parent = ? AND kind = ? ORDER BY id");
  statement.Bind(parent).Bind(Number(kind));
  std::vector<std::int64_t> ids;
  while (statement.Step()) ids.push_back(statement.GetInt(0));
  return ids;
}

std::optional<Object> Tree::Above(std::int64_t id, Kind kind) {
  std::optional<Object> object = Lookup(id);
  while (object && object->kind != kind) object = Lookup(object->parent);
  return object;
}

Object Tree::Insert(std::int64_t parent, Kind kind, Record record) {
  std::string name = NameOf(kind, record);
  Object object{.parent = parent, .kind = kind, .name = std::move(name), .record = std::move(record)};
  object.id = Add(parent, kind, object.name, object.record);
  return object;
}

std::int64_t Tree::Add(std::int64_t parent, Kind kind, std::string_view name, const Record& record) {
  aheadCount_ = 0;
  Statement statement(store_, "INSERT INTO object(id, parent, kind, name, record) VALUES(?, ?, ?, ?, ?)");
  if (kind == RootKind()) {
    statement.Bind(kRoot);
  } else {
    statement.BindNull();  // gets the next one
  }
  statement.Bind(parent).Bind(Number(kind));
  BindName(statement, name);
  if (!statement.BindBytes(record.Bytes()).Insert()) {
    throw Error(Error::Kind::Exists,
                "The " + std::string(GetKindSpec(kind).word) + " " + Quoted(name) + " exists already.");
  }
  return store_.LastId();
}

Object Tree::InsertNew(std::int64_t parent, Kind kind, const Record& given) {
  return Insert(parent, kind, Complete(kind, given));
}

void Tree::Update(const Object& object) {
  aheadCount_ = 0;
  const std::string name = NameOf(object.kind, object.record);
  // What is as it was costs no writing, and is no change.
  Statement statement(store_, "UPDATE object SET name = ?1, record = ?2 WHERE id = ?3 AND record IS NOT ?2");
  BindName(statement, name);
  statement.BindBytes(object.record.Bytes()).Bind(object.id).Step();
}

void Tree::Clear() {
  aheadCount_ = 0;
  Statement(store_, "DELETE FROM object").Step();
}

void Tree::Remove(std::int64_t id) {
  aheadCount_ = 0;
  Statement statement(store_,
                      "WITH RECURSIVE gone(id) AS (SELECT ? UNION SELECT object.id FROM gone JOIN object ON"
                      " object.parent = gone.id) DELETE FROM object WHERE id IN gone");
  statement.Bind(id).Step();
}

}  // namespace store

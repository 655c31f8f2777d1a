#include "host/Tree.h"

#include <map>

#include "host/Description.h"
#include "host/Error.h"
#include "host/Formats.h"

namespace host {

namespace {

/// Most commands read the same few records many times, and parsing is the dearest part of that.
Record Parsed(std::string text) {
  static constexpr std::size_t kMost = 64;
  // Not taken apart at the end: the process ends as a whole.
  static auto& known = *new std::map<std::string, Record>;
  if (const auto found = known.find(text); found != known.end()) return found->second;
  Record record = Record::Parse(text);
  if (known.size() == kMost) known.clear();
  known.emplace(std::move(text), record);
  return record;
}

Object Row(const Statement& row) {
  // Ids are never used again, so what is made below another object has the greater one. Where that does not
  // hold the way up would have no end.
  if (row.GetInt(1) >= row.GetInt(0)) {
    throw Error(Error::Kind::Damaged, "an object is not below an older one");
  }
  std::string name = row.GetText(3);
  if (!IsUtf8(name)) throw Error(Error::Kind::Damaged, "the name of an object is not UTF-8");
  return {.id = row.GetInt(0),
          .parent = row.GetInt(1),
          .kind = static_cast<Kind>(row.GetInt(2)),
          .name = std::move(name),
          .record = Parsed(row.GetText(4))};
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

std::int64_t Number(Kind kind) { return static_cast<std::int64_t>(kind); }

}  // namespace

std::optional<Object> Tree::Lookup(std::int64_t id) {
  Statement statement(store_, "SELECT id, parent, kind, name, record FROM object WHERE id = ?");
  return OneRow(statement.Bind(id));
}

Object Tree::Get(std::int64_t id, Kind kind) {
  std::optional<Object> object = Lookup(id);
  if (kind == Kind::Host && !(object && object->kind == kind)) {
    throw Error(Error::Kind::Damaged, "the object of the host itself is missing");
  }
  const std::string word(GetKindSpec(kind).word);
  if (!object) throw Error(Error::Kind::NotFound, "The " + word + " is gone.");
  if (object->kind != kind) throw Error(Error::Kind::WrongObject, "The object is no " + word + ".");
  return *std::move(object);
}

std::optional<Object> Tree::Find(std::int64_t parent, Kind kind, std::string_view name) {
  Statement statement(
      store_, "SELECT id, parent, kind, name, record FROM object WHERE parent = ? AND kind = ? AND name = ?");
  return OneRow(statement.Bind(parent).Bind(Number(kind)).Bind(name));
}

std::vector<Object> Tree::Children(std::int64_t parent, Kind kind) {
  Statement statement(
      store_,
      "SELECT id, parent, kind, name, record FROM object WHERE parent = ? AND kind = ? ORDER BY place");
  statement.Bind(parent).Bind(Number(kind));
  std::vector<Object> children;
  while (statement.Step()) children.push_back(Row(statement));
  return children;
}

std::vector<std::int64_t> Tree::ChildIds(std::int64_t parent, Kind kind) {
  Statement statement(store_, "SELECT id FROM object WHERE parent = ? AND kind = ? ORDER BY place");
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
  if (!object.name.empty() && Find(parent, kind, object.name)) {
    throw Error(Error::Kind::Exists, "The " + std::string(GetKindSpec(kind).word) + " " +
                                         Quoted(object.name) + " exists already.");
  }
  const std::string text = object.record.Text();
  {
    Statement statement(store_,
                        "INSERT INTO object(parent, kind, place, name, record) VALUES(?1, ?2, (SELECT"
                        " coalesce(max(place), 0) + 1 FROM object WHERE parent = ?1 AND kind = ?2), ?3, ?4)");
    statement.Bind(parent).Bind(Number(kind));
    BindName(statement, object.name);
    statement.Bind(text).Step();
  }
  object.id = store_.LastId();
  return object;
}

Object Tree::InsertNew(std::int64_t parent, Kind kind, const Record& given) {
  return Insert(parent, kind, Complete(kind, given));
}

void Tree::Update(const Object& object) {
  const std::string text = object.record.Text();
  const std::string name = NameOf(object.kind, object.record);
  Statement statement(store_, "UPDATE object SET name = ?, record = ? WHERE id = ?");
  BindName(statement, name);
  statement.Bind(text).Bind(object.id).Step();
}

void Tree::Remove(std::int64_t id) {
  Statement statement(store_,
                      "WITH RECURSIVE gone(id) AS (SELECT ? UNION SELECT object.id FROM gone JOIN object ON"
                      " object.parent = gone.id) DELETE FROM object WHERE id IN gone");
  statement.Bind(id).Step();
}

}  // namespace host

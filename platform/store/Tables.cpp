#include "store/Tables.h"

#include <nlohmann/json.hpp>
#include <string>

#include "store/Error.h"
#include "store/Record.h"
#include "store/Store.h"

namespace store {

namespace {

constexpr int kApplicationId = 0x7465736f;  // marks a database as a host's
constexpr int kVersion = 2;

// The ids of siblings are in their order: what is added comes behind all others.
constexpr const char* kTables =
    "CREATE TABLE object(id INTEGER PRIMARY KEY AUTOINCREMENT, parent INTEGER NOT NULL, kind INTEGER NOT "
    "NULL, name TEXT, record BLOB NOT NULL, UNIQUE(parent, kind, name));"
    "CREATE INDEX sibling ON object(parent, kind);";

[[noreturn]] void Refuse(const Store& store, Error::Kind kind, const std::string& reason) {
  throw Error(kind, "The host database " + store.GetPath() + reason);
}

/// A record of version 1, JSON as text.
Record FromText(const std::string& text) {
  constexpr int kMostDepth = 16;
  const auto check = [](int depth, Json::parse_event_t, const Json&) {
    if (depth > kMostDepth) throw Error(Error::Kind::Damaged, "a record is nested too deeply");
    return true;
  };
  try {
    return Record(Json::parse(text, check));
  } catch (const Json::exception&) {
    throw Error(Error::Kind::Damaged, "a record is not a JSON object");
  }
}

/// In version 1 the records were texts, and siblings had a place besides their ids, which are in the same
/// order.
void FromVersion1(Store& store) {
  store.Execute("ALTER TABLE object RENAME TO former");
  store.Execute(kTables);
  {
    Statement rows(store, "SELECT id, parent, kind, name, record FROM former ORDER BY id");
    while (rows.Step()) {
      const std::string name(rows.GetText(3));
      const Record record = FromText(std::string(rows.GetText(4)));
      Statement insert(store, "INSERT INTO object VALUES(?, ?, ?, nullif(?, ''), ?)");
      insert.Bind(rows.GetInt(0)).Bind(rows.GetInt(1)).Bind(rows.GetInt(2)).Bind(name);
      insert.BindBytes(record.Bytes()).Step();
    }
  }
  // The id of an object that is gone is not used again.
  store.Execute(
      "UPDATE sqlite_sequence SET seq = (SELECT seq FROM sqlite_sequence WHERE name = 'former')"
      " WHERE name = 'object';"
      "DROP TABLE former");
}

void RequireKnown(const Store& store, std::int64_t version) {
  if (version > kVersion)
    Refuse(store, Error::Kind::NotSupported, " belongs to a newer version of this program.");
  if (version < 1) Refuse(store, Error::Kind::DamagedFile, " is damaged: it has no schema version.");
}

void Migrate(Store& store, std::int64_t version) {
  RequireKnown(store, version);
  store.CheckStructure();  // what damage hides would be lost
  if (version == 1) FromVersion1(store);
}

void SetVersion(Store& store) { store.Execute(("PRAGMA user_version=" + std::to_string(kVersion)).c_str()); }

}  // namespace

void CreateTables(Store& store) {
  store.Execute(kTables);
  store.Execute(("PRAGMA application_id=" + std::to_string(kApplicationId)).c_str());
  SetVersion(store);
}

bool CheckVersion(Store& store) {
  Transaction reading(store, Transaction::Access::Read);  // one look at the file for both
  if (store.Number("PRAGMA application_id") != kApplicationId)
    Refuse(store, Error::Kind::DamagedFile, " is not a host database.");
  const std::int64_t version = store.Number("PRAGMA user_version");
  reading.Commit();
  RequireKnown(store, version);
  return version == kVersion;
}

void UpdateTables(Store& store) try {
  if (CheckVersion(store)) return;
  Transaction transaction(store, Transaction::Access::Change);
  const std::int64_t version = store.Number("PRAGMA user_version");  // another process may have been first
  if (version != kVersion) {
    Migrate(store, version);
    SetVersion(store);
  }
  transaction.Commit();
} catch (const Error& error) {
  if (error.GetKind() != Error::Kind::Damaged) throw;
  Refuse(store, Error::Kind::DamagedFile, std::string(" is damaged: ") + error.what() + ".");
}

}  // namespace store

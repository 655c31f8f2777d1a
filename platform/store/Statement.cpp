#include <sqlite3.h>

#include "store/Store.h"

namespace store {

Statement::~Statement() {
  sqlite3_reset(statement_);
  sqlite3_clear_bindings(statement_);
}

Statement& Statement::Bind(std::int64_t value) {
  sqlite3_bind_int64(statement_, ++bound_, value);
  return *this;
}

Statement& Statement::Bind(std::string_view value) {
  // An empty view may have no address, which would bind a null.
  const char* data = value.data() == nullptr ? "" : value.data();
  const int code =
      sqlite3_bind_text(statement_, ++bound_, data, static_cast<int>(value.size()), SQLITE_STATIC);
  if (code != SQLITE_OK) store_.Fail(code);
  return *this;
}

Statement& Statement::BindBytes(std::string_view value) {
  const int code =
      sqlite3_bind_blob(statement_, ++bound_, value.data(), static_cast<int>(value.size()), SQLITE_STATIC);
  if (code != SQLITE_OK) store_.Fail(code);
  return *this;
}

Statement& Statement::BindNull() {
  sqlite3_bind_null(statement_, ++bound_);
  return *this;
}

bool Statement::Step() {
  const int code = store_.Step(statement_);
  if (code == SQLITE_ROW) return true;
  if (code != SQLITE_DONE) store_.Fail(code);
  return false;
}

bool Statement::Insert() {
  const int code = store_.Step(statement_);
  if (code == SQLITE_DONE) return true;
  if (sqlite3_extended_errcode(store_.database_) != SQLITE_CONSTRAINT_UNIQUE) store_.Fail(code);
  return false;
}

std::int64_t Statement::GetInt(int column) const { return sqlite3_column_int64(statement_, column); }

std::string_view Statement::GetText(int column) const {
  const auto* text = reinterpret_cast<const char*>(sqlite3_column_text(statement_, column));
  return {text, static_cast<std::size_t>(sqlite3_column_bytes(statement_, column))};
}

std::string_view Statement::GetBytes(int column) const {
  const auto* bytes = static_cast<const char*>(sqlite3_column_blob(statement_, column));
  return {bytes, static_cast<std::size_t>(sqlite3_column_bytes(statement_, column))};
}

}  // namespace store

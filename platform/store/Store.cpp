#include "store/Store.h"

#include <sqlite3.h>
#include <stdlib.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <ctime>
#include <fstream>
#include <new>

#include "store/Error.h"
#include "store/Files.h"
#include "store/Tables.h"
#include "store/Text.h"

namespace store {

namespace {

constexpr int kFewPages = 64;

/// The same file by a path on which no folder is a link.
std::string WithoutLinks(const std::string& path) {
  const std::size_t slash = path.rfind('/');
  const std::unique_ptr<char, void (*)(void*)> folder(
      realpath(slash == path.npos ? "." : path.substr(0, slash + 1).c_str(), nullptr), free);
  return folder == nullptr ? path : std::string(folder.get()) + "/" + path.substr(slash + 1);
}

/// Opens a connection. What SQLite sets aside for a long life, a process of one command would only pay for:
/// each page that is touched for the first time is an interrupt.
int Open(const std::string& path, int access, sqlite3** database) {
  static const int configured = [] {
    sqlite3_config(SQLITE_CONFIG_PAGECACHE, nullptr, 0, 0);
    sqlite3_config(SQLITE_CONFIG_LOOKASIDE, 0, 0);
    return sqlite3_config(SQLITE_CONFIG_MEMSTATUS, 0);
  }();
  static_cast<void>(configured);  // without effect where SQLite works already
  const auto open = [&](const std::string& name) {
    return sqlite3_open_v2(name.c_str(), database, access | SQLITE_OPEN_NOMUTEX | SQLITE_OPEN_NOFOLLOW,
                           nullptr);
  };
  const int code = open(path);
  if (code == SQLITE_OK || sqlite3_extended_errcode(*database) != SQLITE_CANTOPEN_SYMLINK) return code;
  // SQLite refuses folders that are links, too.
  sqlite3_close(*database);
  return open(WithoutLinks(path));
}

/// What SQLite says quotes the file, and can be anything where that is damaged: then its words for @p code
/// alone.
std::string Words(const std::string& message, int code) {
  const bool printable = IsUtf8(message) && std::none_of(message.begin(), message.end(), [](char c) {
                           return (c >= 0 && c < ' ') || c == 0x7f;
                         });
  return printable ? message : sqlite3_errstr(code);
}

void RollBack(Store& store) {
  try {
    Statement(store, "ROLLBACK").Step();
  } catch (const std::exception&) {
    // SQLite has rolled back by itself: after some failures there is no transaction left.
  }
}

int workers = 0;  // stores that have a file open to work with it

/// Whether SQLite would make files beside the database to read it: the form that its header names has a log.
/// This program makes none of that form.
bool HasLog(const std::string& path) {
  constexpr std::size_t kForms = 18;  // https://www.sqlite.org/fileformat2.html#the_database_header
  // Where this process works with the file it is none; and to close it here would end the process's locks.
  if (workers > 0) return false;
  char begin[kForms + 2] = "";
  std::ifstream(path, std::ios::binary).read(begin, sizeof begin);
  return std::strcmp(begin, "SQLite format 3") == 0 && (begin[kForms] == 2 || begin[kForms + 1] == 2);
}

int readings = 0;
std::uint64_t lastReading = 0;  // the number of the one that was there first
Store* kept = nullptr;          // the store with a transaction that is open for the sake of them
time_t keptSince = 0;

/// In seconds; asked for at each call, and so the clock that is read without counting.
time_t Now() {
  timespec now{};
  clock_gettime(CLOCK_MONOTONIC_COARSE, &now);
  return now.tv_sec;
}

/// SQLite's own way to wait is to sleep for up to 100 ms between two looks, which would miss most of the
/// moments in which a process that writes much lets others in.
int KeepWaiting(void* patience, int looks) {
  if (looks * kPauseMilliseconds >= *static_cast<const int*>(patience)) return 0;
  usleep(kPauseMilliseconds * 1000);
  return 1;
}

bool IsKeptTooLong() { return Now() - keptSince > kPatienceMilliseconds / 2 / 1000; }

Error::Kind KindOf(int code, int systemError) {
  switch (code & 0xff) {
    case SQLITE_CORRUPT:
    case SQLITE_NOTADB:
    case SQLITE_ERROR:  // a statement that fits every host does not fit this one
      return Error::Kind::DamagedFile;
    case SQLITE_BUSY:
    case SQLITE_LOCKED:
      return Error::Kind::Busy;
    case SQLITE_READONLY:
    case SQLITE_PERM:
    case SQLITE_AUTH:
      return Error::Kind::Denied;
    case SQLITE_FULL:
      return Error::Kind::NoSpace;
    default:
      return Error::KindOfSystem(systemError);
  }
}

std::string Reason(int code, int systemError, const std::string& message) {
  switch (code & 0xff) {
    case SQLITE_CORRUPT:
    case SQLITE_NOTADB:
      return std::string(" is damaged: ") + message + ".";
    case SQLITE_BUSY:
    case SQLITE_LOCKED:
      return " is locked by another process.";
    case SQLITE_READONLY:
      return " cannot be written: it is read-only.";
    case SQLITE_FULL:
      return std::string(" cannot be written: ") + strerror(ENOSPC) + ".";
    case SQLITE_CANTOPEN:
    case SQLITE_PERM:
    case SQLITE_AUTH:
      return std::string(" cannot be opened: ") + (systemError != 0 ? strerror(systemError) : message) + ".";
    case SQLITE_IOERR:
      return std::string(" cannot be read or written: ") +
             (systemError != 0 ? strerror(systemError) : message) + ".";
    default:
      return std::string(" cannot be used: ") + message + ".";
  }
}

}  // namespace

std::vector<std::string> JournalsOf(const std::string& path) {
  return {path + "-journal", path + "-wal", path + "-shm"};
}

void RequireNoJournalAlone(const std::string& path) {
  struct stat status;
  for (const std::string& journal : JournalsOf(path)) {
    // What another process has just made is no matter.
    if (lstat(journal.c_str(), &status) != 0 || lstat(path.c_str(), &status) == 0) continue;
    throw Error(Error::Kind::DamagedFile, "The host database " + path + " is gone, and its journal " +
                                              journal +
                                              " is still there: put the database back, or remove the journal"
                                              " for a new host.");
  }
}

Store::Store() : path_("in memory"), checked_(true) {
  if (Open(":memory:", SQLITE_OPEN_READWRITE, &database_) != SQLITE_OK) {
    sqlite3_close(database_);
    throw std::bad_alloc();
  }
}

Store::Store(const std::string& path, Use use) : path_(path) {
  constexpr int kMostToLook = 1000;
  const bool isWork = use == Use::Work;
  struct stat status;
  const auto refuse = [&](Error::Kind kind, const std::string& reason) {
    throw Error(kind, "The host database " + path_ + reason);
  };
  if (!IsRegularFile("The host database", path, status)) {
    refuse(Error::Kind::NotFound, std::string(" cannot be opened: ") + strerror(ENOENT) + ".");
  }
  if (status.st_size == 0) refuse(Error::Kind::DamagedFile, " is damaged: it is empty.");
  if (!isWork && HasLog(path)) {
    refuse(Error::Kind::DamagedFile,
           " is damaged: it is of a form with a log, which this program does not use.");
  }
  if (isWork) KeepPrivate(path, status);
  for (const std::string& journal : JournalsOf(path)) {
    const bool isThere = IsRegularFile("The host database's journal", journal, status);
    if (isThere && isWork) KeepPrivate(journal, status);
  }
  try {
    const int code = Open(path, isWork ? SQLITE_OPEN_READWRITE : SQLITE_OPEN_READONLY, &database_);
    if (code != SQLITE_OK) Fail(code);
    SetPatience(isWork ? Patience() : std::min(Patience(), kMostToLook));
    if (isWork) UpdateTables(*this);
    isWorker_ = isWork;
    workers += isWork ? 1 : 0;
  } catch (...) {
    Close();
    throw;
  }
}

Store::~Store() { Close(); }

void Store::Close() {
  if (kept == this) kept = nullptr;
  workers -= isWorker_ ? 1 : 0;
  for (const auto& [sql, statement] : statements_) sqlite3_finalize(statement);
  sqlite3_close(database_);
}

void Store::RequireOk(const char* pragma) {
  Statement statement(*this, pragma);
  const std::string found(statement.Step() ? statement.GetText(0) : "ok");
  if (found != "ok") {
    // A heading may stand on a line of its own in front.
    throw Error(Error::Kind::DamagedFile,
                "The host database " + path_ +
                    Reason(SQLITE_CORRUPT, 0, Words(found.substr(found.rfind('\n') + 1), SQLITE_CORRUPT)));
  }
}

void Store::CheckStructure() {
  if (!checked_) RequireOk("PRAGMA integrity_check(1)");
  checked_ = true;
}

void Store::CheckPages() {
  if (!checked_) RequireOk("PRAGMA quick_check(1)");
}

bool Store::IsSmall() { return Number("PRAGMA page_count") <= kFewPages; }

void Store::Fail(int code) {
  if ((code & 0xff) == SQLITE_NOMEM) throw std::bad_alloc();
  const bool real = sqlite3_errcode(database_) == (code & 0xff);
  const int systemError = real ? sqlite3_system_errno(database_) : 0;
  throw Error(
      KindOf(code, systemError),
      "The host database " + path_ +
          Reason(code, systemError, Words(real ? sqlite3_errmsg(database_) : sqlite3_errstr(code), code)));
}

void Store::SetPatience(int milliseconds) {
  patience_ = milliseconds;
  sqlite3_busy_handler(database_, KeepWaiting, &patience_);
}

void Store::FailStatement(int number, int code) { fault_ = {.countdown = number, .code = code}; }

int Store::Step(sqlite3_stmt* statement) {
  if (fault_.countdown > 0 && --fault_.countdown == 0) {
    fault_.happened = true;
    return fault_.code;
  }
  return sqlite3_step(statement);
}

sqlite3_stmt* Store::Prepared(const char* sql) {
  for (const auto& [known, statement] : statements_) {
    if (known == sql) return statement;
  }
  // It has its place before there is one: a statement that nobody finalizes keeps the database from being
  // closed.
  sqlite3_stmt*& statement = statements_.emplace_back(sql, nullptr).second;
  const int code = sqlite3_prepare_v3(database_, sql, -1, 0, &statement, nullptr);
  if (code != SQLITE_OK) {
    statements_.pop_back();
    Fail(code);
  }
  return statement;
}

void Store::Execute(const char* sql) {
  while (*sql != '\0') {
    sqlite3_stmt* statement = nullptr;
    int code = sqlite3_prepare_v3(database_, sql, -1, 0, &statement, &sql);
    if (code != SQLITE_OK) Fail(code);
    if (statement == nullptr) return;  // blanks at the end
    while ((code = Step(statement)) == SQLITE_ROW) {
    }
    sqlite3_finalize(statement);
    if (code != SQLITE_DONE) Fail(code);
  }
}

std::int64_t Store::Number(const char* sql) {
  Statement statement(*this, sql);
  return statement.Step() ? statement.GetInt(0) : 0;
}

std::string Store::Serialize() {
  sqlite3_int64 size = 0;
  const std::unique_ptr<unsigned char, void (*)(void*)> bytes(sqlite3_serialize(database_, "main", &size, 0),
                                                              sqlite3_free);
  if (bytes == nullptr) throw std::bad_alloc();
  return std::string(reinterpret_cast<const char*>(bytes.get()), static_cast<std::size_t>(size));
}

std::int64_t Store::LastId() const { return sqlite3_last_insert_rowid(database_); }

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

void Store::EndReading() {
  if (kept != this) return;
  kept = nullptr;
  try {
    Statement(*this, "COMMIT").Step();
  } catch (...) {
    RollBack(*this);
    throw;
  }
}

bool Store::IsWithin() const {
  return around_ != Around::Nothing && kept != this && sqlite3_get_autocommit(database_) == 0;
}

void Store::BeginChange() {
  if (around_ == Around::Nothing) {
    Statement(*this, "BEGIN IMMEDIATE").Step();
    return;
  }
  if (!IsWithin()) {
    RefuseLost();
    // The file stays as it is: no page is written ahead of a commit, and there will be none.
    if (around_ == Around::Rehearsal) Execute("PRAGMA cache_spill=off; PRAGMA journal_mode=memory");
    Statement(*this, "BEGIN IMMEDIATE").Step();
    isGroupBegun_ = around_ == Around::Group;
  }
  Statement(*this, "SAVEPOINT part").Step();
}

void Store::RefuseLost() const {
  if (!IsGroupLost()) return;
  throw Error(Error::Kind::Failed, "The host database " + path_ + " has lost changes that this builds on.");
}

void Store::UndoPart() {
  try {
    Statement(*this, "ROLLBACK TO part").Step();
    Statement(*this, "RELEASE part").Step();
  } catch (const std::exception&) {
    // A part that cannot be undone by itself is undone with all of it.
    RollBack(*this);
  }
}

void Store::CommitGroup() {
  EndReading();
  RefuseLost();
  if (isGroupBegun_) {
    try {
      Statement(*this, "COMMIT").Step();
    } catch (...) {
      RollBack(*this);
      throw;
    }
  }
  isGroupBegun_ = false;
  around_ = Around::Nothing;
}

bool Store::UndoAll() noexcept {
  isGroupBegun_ = false;
  const Around around = std::exchange(around_, Around::Nothing);
  try {
    EndReading();
    if (sqlite3_get_autocommit(database_) == 0) RollBack(*this);
    if (around == Around::Rehearsal) Execute("PRAGMA journal_mode=delete; PRAGMA cache_spill=on");
  } catch (const std::exception&) {
    return false;
  }
  return sqlite3_get_autocommit(database_) != 0;
}

std::int64_t Store::CountChanges() const { return sqlite3_total_changes64(database_); }

Reading::Reading() {
  if (readings++ == 0) ++lastReading;
}

std::uint64_t Reading::Current() { return readings == 0 ? 0 : lastReading; }

Reading::~Reading() {
  if (--readings > 0 || kept == nullptr) return;
  try {
    kept->EndReading();
  } catch (const std::exception&) {
    // It has read what it was to read.
  }
}

Transaction::Transaction(Store& store, Access access) : store_(store), access_(access) {
  if (access == Access::Read) {
    if (kept == &store && IsKeptTooLong()) store.EndReading();
    if (kept == &store) {
      open_ = false;
    } else {
      if (store.IsWithin()) {
        open_ = false;
      } else {
        Statement(store, "BEGIN").Step();
      }
      ++store.state_;
    }
  } else {
    store.EndReading();
    // Some damage shows as rows that are not there; what is written on top of it would be lost as well. In a
    // large file the look would take many times what a change does.
    if (store.IsSmall()) store.CheckStructure();
    isPart_ = store.around_ != Store::Around::Nothing;
    store.BeginChange();
    ++store.state_;
  }
  store_.inTransaction_ = true;
}

Transaction::~Transaction() {
  store_.inTransaction_ = false;
  if (open_ && isPart_) {
    store_.UndoPart();
  } else if (open_) {
    RollBack(store_);
  }
}

void Transaction::Commit() {
  if (open_) {
    if (isPart_) {
      Statement(store_, "RELEASE part").Step();
    } else if (access_ == Access::Read && readings > 0 && kept == nullptr) {
      kept = &store_;
      keptSince = Now();
    } else {
      Statement(store_, "COMMIT").Step();
    }
  }
  open_ = false;
  store_.inTransaction_ = false;
}

}  // namespace store

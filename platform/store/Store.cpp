#include "store/Store.h"

#include <sqlite3.h>
#include <stdlib.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fstream>
#include <new>

#include "store/Error.h"
#include "store/Files.h"
#include "store/SqliteFailure.h"
#include "store/Tables.h"

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

int workers = 0;  // stores that have a file open to work with it

/// Whether SQLite would make files beside the database to read it: the form that its header names has a log.
/// This program makes none of that form.
bool HasLog(const std::string& path) {
  constexpr std::size_t kForms = 18;  // https://www.sqlite.org/fileformat2.html#the_database_header
  // Where this process works with the file it is none; and to close it here would end the process's locks.
  if (workers > 0) return false;
  char begin[kForms + 2] = "";
  std::ifstream(path, std::ios::binary).read(begin, sizeof begin);
  using namespace std::string_view_literals;
  return std::string_view(begin, 16) == "SQLite format 3\0"sv &&
         (begin[kForms] == 2 || begin[kForms + 1] == 2);
}

/// SQLite's own way to wait is to sleep for up to 100 ms between two looks, which would miss most of the
/// moments in which a process that writes much lets others in.
int KeepWaiting(void* patience, int looks) {
  if (looks * kPauseMilliseconds >= *static_cast<const int*>(patience)) return 0;
  usleep(kPauseMilliseconds * 1000);
  return 1;
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
  ForgetReading();
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

void Store::FailTransaction(int number, int code) {
  fault_ = {.countdown = number, .code = code, .ofTransaction = true};
}

int Store::Step(sqlite3_stmt* statement) {
  if (fault_.countdown > 0 && --fault_.countdown == 0) {
    fault_.happened = true;
    if (fault_.ofTransaction) sqlite3_exec(database_, "ROLLBACK", nullptr, nullptr, nullptr);
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

}  // namespace store

/// The database under a host: one connection, transactions and prepared statements, and a seam for faults.
///
/// Every failure is a host::Error that names the file and tells the reason.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

struct sqlite3;
struct sqlite3_stmt;

#pragma GCC visibility push(default)

namespace host {

/// The files beside the database @p path that may hold a part of it.
std::vector<std::string> JournalsOf(const std::string& path);

class Store {
 public:
  /// An empty database in memory.
  Store();
  /// The database in the file @p path, which exists and is a host's.
  explicit Store(const std::string& path);
  Store(const Store&) = delete;
  Store& operator=(const Store&) = delete;
  ~Store();

  /// Runs statements that give no rows.
  void Execute(const char* sql);
  /// The number that a statement without arguments gives.
  std::int64_t Number(const char* sql);
  /// The database as the bytes of a file.
  std::string Serialize();
  /// The id of the row that was inserted last.
  std::int64_t LastId() const;
  const std::string& GetPath() const { return path_; }
  /// True while a Transaction does its work.
  bool IsInTransaction() const { return inTransaction_; }
  /// Ends what a Reading keeps open.
  void EndReading();
  /// An Error where the file's structure is damaged. Looks once at the whole of it; later calls cost nothing.
  void CheckStructure();
  /// True where looking at the whole file takes no more than a few tenths of a millisecond.
  bool IsSmall();
  /// How long a lock of another process is waited for; 20 seconds from the start.
  void SetPatience(int milliseconds);

  /// Tests only: statement @p number from now (1 is the next) fails with the SQLite code @p code without
  /// having run. 0 ends it.
  void FailStatement(int number, int code);
  /// True when the fault asked for has happened.
  bool HasFailed() const { return fault_.happened; }

 private:
  friend class Statement;
  friend class Transaction;
  sqlite3_stmt* Prepared(const char* sql);
  int Step(sqlite3_stmt* statement);
  [[noreturn]] void Fail(int code);
  void CheckVersion();
  void Close();

  struct Fault {
    int countdown = 0;
    int code = 0;
    bool happened = false;
  };
  std::string path_;
  bool checked_ = false;
  bool inTransaction_ = false;
  sqlite3* database_ = nullptr;
  /// By the address of the text: each statement has one place in the code.
  std::vector<std::pair<const char*, sqlite3_stmt*>> statements_;
  Fault fault_;
};

/// One run of a statement; the texts given to it stay alive until it is done.
class Statement {
 public:
  /// @p sql is a literal. The same one is not run again while this object lives.
  Statement(Store& store, const char* sql) : store_(store), statement_(store.Prepared(sql)) {}
  Statement(const Statement&) = delete;
  Statement& operator=(const Statement&) = delete;
  ~Statement();

  /// Arguments are bound in order.
  Statement& Bind(std::int64_t value);
  Statement& Bind(std::string_view value);
  Statement& BindNull();
  /// Steps to the next row; false when there is none.
  bool Step();
  std::int64_t GetInt(int column) const;
  std::string GetText(int column) const;

 private:
  Store& store_;
  sqlite3_stmt* statement_;
  int bound_ = 0;
};

/// While one of these lives, all that is read comes from one state of the store, at the price of one
/// transaction: that of the first read stays open for those that follow, until the last of these goes, or
/// until something is changed. Others cannot write meanwhile, so none should live while a person, or a pipe,
/// is waited for.
class Reading {
 public:
  Reading();
  Reading(const Reading&) = delete;
  Reading& operator=(const Reading&) = delete;
  ~Reading();
};

/// What runs in between happens whole, or not at all when Commit is not reached.
class Transaction {
 public:
  enum class Access { Read, Change };
  Transaction(Store& store, Access access);
  Transaction(const Transaction&) = delete;
  Transaction& operator=(const Transaction&) = delete;
  ~Transaction();
  void Commit();

 private:
  Store& store_;
  Access access_;
  bool open_ = true;
};

/// The tables of a new database.
void CreateTables(Store& store);

}  // namespace host

#pragma GCC visibility pop

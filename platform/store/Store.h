/// The database under a host: one connection, transactions and prepared statements, and a seam for faults.
///
/// Every failure is a store::Error that names the file and tells the reason.
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

namespace store {

/// The files beside the database @p path that may hold a part of it.
std::vector<std::string> JournalsOf(const std::string& path);
/// An Error where one of them is there, and the database is not: a new one would take the changes in it for
/// its own.
void RequireNoJournalAlone(const std::string& path);

class Store {
 public:
  /// An empty database in memory.
  Store();
  /// What a database is opened for: to work with it, which brings it up to date, or only to look at it. Then
  /// nothing about the file is changed, not even its mode; what it is, CheckVersion tells; and a lock of
  /// another process is waited for a second at most.
  enum class Use { Work, Look };
  /// The database in the file @p path, which exists and is a host's.
  explicit Store(const std::string& path, Use use = Use::Work);
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
  /// A number that is another one in each transaction: what was read under the same one is as it was.
  std::uint64_t GetState() const { return state_; }
  /// Ends what a Reading keeps open.
  void EndReading();
  /// An Error where the file's structure is damaged. Looks once at the whole of it; later calls cost nothing.
  void CheckStructure();
  /// The same for what is all to be replaced: that no page is in use twice, and none lost.
  void CheckPages();
  /// True where looking at the whole file takes no more than a few tenths of a millisecond.
  bool IsSmall();
  /// How long a lock of another process is waited for; as store::Patience has it from the start.
  void SetPatience(int milliseconds);

  /// A dry run: what transactions change lasts until UndoAll, and is seen by this object alone. Nothing of it
  /// gets into a file. Others are kept from writing, not from reading, from the first change on.
  void BeginRehearsal() { around_ = Around::Rehearsal; }
  /// A group: the same, until CommitGroup makes all of it durable at once or UndoAll undoes it.
  void BeginGroup() { around_ = Around::Group; }
  /// Ends the group. Where this throws, nothing of it lasts: it is lost, and UndoAll is to end it.
  void CommitGroup();
  /// True where a failure has undone what was changed in the group. Further changes are refused then.
  bool IsGroupLost() const { return isGroupBegun_ && !IsWithin(); }
  /// Ends the rehearsal or the group, and undoes it. False where the database has to be closed for that.
  bool UndoAll() noexcept;
  /// How many rows have been written since the database was opened.
  std::int64_t CountChanges() const;

  /// Tests only: statement @p number from now (1 is the next) fails with the SQLite code @p code without
  /// having run. 0 ends it.
  void FailStatement(int number, int code);
  /// Tests only: the same, and SQLite ends the transaction by itself, as it may where the disk or the memory
  /// does not suffice.
  void FailTransaction(int number, int code);
  /// True when the fault asked for has happened.
  bool HasFailed() const { return fault_.happened; }

 private:
  friend class Statement;
  friend class Transaction;
  sqlite3_stmt* Prepared(const char* sql);
  int Step(sqlite3_stmt* statement);
  [[noreturn]] void Fail(int code);
  void Close();
  void RequireOk(const char* pragma);
  void ForgetReading();
  /// True where the one transaction of a rehearsal or a group is open, around those of the calls. One failure
  /// or another may have ended it.
  bool IsWithin() const;
  void BeginChange();
  void RefuseLost() const;
  void UndoPart();

  enum class Around { Nothing, Rehearsal, Group };
  struct Fault {
    int countdown = 0;
    int code = 0;
    bool ofTransaction = false;
    bool happened = false;
  };
  std::string path_;
  bool isWorker_ = false;  // it has a file open to work with it
  bool checked_ = false;
  bool inTransaction_ = false;
  Around around_ = Around::Nothing;
  bool isGroupBegun_ = false;  // something was to be changed in it
  std::uint64_t state_ = 0;
  sqlite3* database_ = nullptr;
  int patience_ = 0;  // in milliseconds
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
  Statement& BindBytes(std::string_view value);
  Statement& BindNull();
  /// Steps to the next row; false when there is none.
  bool Step();
  /// Runs an insertion; false where a unique value is taken, which leaves all as it was.
  bool Insert();
  std::int64_t GetInt(int column) const;
  /// They stay until the next Step.
  std::string_view GetText(int column) const;
  std::string_view GetBytes(int column) const;

 private:
  Store& store_;
  sqlite3_stmt* statement_;
  int bound_ = 0;
};

/// While one of these lives, all that is read comes from one state of the store, at the price of one
/// transaction: that of the first read stays open for those that follow, until the last of these goes, or
/// until something is changed. Others cannot write meanwhile, so none should live while a person, or a pipe,
/// is waited for. What has been open for half the time that they wait begins anew, so that one of these that
/// is forgotten cannot make them fail.
class Reading {
 public:
  Reading();
  Reading(const Reading&) = delete;
  Reading& operator=(const Reading&) = delete;
  ~Reading();

  /// A number of its own for all the time from the first of these to the last; 0 while there is none.
  static std::uint64_t Current();
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
  /// A part of the rehearsal's or the group's, and undone or kept within it.
  bool isPart_ = false;
};

}  // namespace store

#pragma GCC visibility pop

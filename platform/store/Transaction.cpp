/// Transactions, and what stands around them: readings, dry runs and groups.
#include <sqlite3.h>

#include <ctime>

#include "store/Error.h"
#include "store/Files.h"
#include "store/Store.h"

namespace store {

namespace {

void RollBack(Store& store) {
  try {
    Statement(store, "ROLLBACK").Step();
  } catch (const std::exception&) {
    // SQLite has rolled back by itself: after some failures there is no transaction left.
  }
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

bool IsKeptTooLong() { return Now() - keptSince > kPatienceMilliseconds / 2 / 1000; }

}  // namespace

void Store::ForgetReading() {
  if (kept == this) kept = nullptr;
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

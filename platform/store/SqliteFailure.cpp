#include "store/SqliteFailure.h"

#include <sqlite3.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

#include "store/Text.h"

namespace store {

std::string Words(const std::string& message, int code) {
  const bool printable = IsUtf8(message) && std::none_of(message.begin(), message.end(), [](char c) {
                           return (c >= 0 && c < ' ') || c == 0x7f;
                         });
  return printable ? message : sqlite3_errstr(code);
}

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

}  // namespace store

/// What SQLite's result codes are to an administrator.
#pragma once

#include <string>

#include "store/Error.h"

namespace store {

// Of a result code, extended or not; @p systemError is the errno behind it, 0 for none.
Error::Kind KindOf(int code, int systemError);
/// What follows the file's name in a sentence; @p message is SQLite's own, as Words gives it.
std::string Reason(int code, int systemError, const std::string& message);

/// What SQLite says quotes the file, and can be anything where that is damaged: then its words for @p code
/// alone.
std::string Words(const std::string& message, int code);

}  // namespace store

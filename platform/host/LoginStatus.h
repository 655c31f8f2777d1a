/// How logins fail: the words of Network.h as sentences.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "host/Storage.h"
#include "host/Targets.h"

#pragma GCC visibility push(default)

namespace host {

/// What the login status word @p status, which is not kDone, says: a sentence.
std::string LoginStatusText(std::uint32_t status);

/// The logins of one operation that failed.
class FailedLogins {
 public:
  /// The login to @p target ended with @p status, which may be kDone, or kNotAsked.
  void Note(const KnownTarget& target, std::uint32_t status);
  /// Tells of the first that failed, and how many there were; nothing where none failed.
  std::optional<Error> GetError() const;

 private:
  std::string target_;
  std::uint32_t status_ = 0;
  std::size_t count_ = 0;
};

}  // namespace host

#pragma GCC visibility pop

/// What went wrong on the host.
#pragma once

#include <stdexcept>
#include <string>
#include <string_view>

#pragma GCC visibility push(default)

namespace store {

/// The one failure type; std::bad_alloc is the only other thing that is thrown. what() is a whole sentence
/// for an administrator.
class Error : public std::runtime_error {
 public:
  /// Why. Each has a code, by which scripts tell them apart: those are stable, and so is which refusal has
  /// which.
  enum class Kind {
    Failed,        ///< anything else
    NotFound,      ///< what is named is not there, or not any more
    Exists,        ///< what is to be added is there already
    Invalid,       ///< what is given is no value of its kind
    OutOfRange,    ///< a number, or a length, that is too small or too large
    NotSettable,   ///< there is such a setting, and here it cannot be changed
    NotSupported,  ///< this object has no such thing
    WrongObject,   ///< the object is of another kind
    WrongState,    ///< something else, which can be changed, stands against it
    InUse,         ///< something uses what is to go
    TooMany,       ///< there is no room for one more
    Busy,          ///< another process keeps it locked
    Denied,        ///< the system does not let the caller at the file
    Damaged,       ///< what is in the host's file makes no sense; the choke point makes DamagedFile of it
    DamagedFile,   ///< the same, with the file's name in the text; or a file that is none of its kind
    NoSpace,       ///< a disk, or a limit of one, is full
    NoMemory,      ///< as std::bad_alloc is told of
    LoginRefused,  ///< the other side of an exchange refused
    NoAnswer,      ///< nobody answered
  };

  Error(Kind kind, const std::string& text) : std::runtime_error(text), kind_(kind) {}

  /// The kind that an error of the system, an errno, is of.
  static Kind KindOfSystem(int error);

  Kind GetKind() const { return kind_; }
  /// A word, such as "not-found".
  std::string_view Code() const;

 private:
  Kind kind_;
};

}  // namespace store

#pragma GCC visibility pop

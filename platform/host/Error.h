/// What went wrong on the host.
#pragma once

#include <cstdint>
#include <stdexcept>
#include <string>

#pragma GCC visibility push(default)

namespace host {

/// The one failure type of this library; std::bad_alloc is the only other thing that its operations throw.
/// what() is a whole sentence for an administrator.
class Error : public std::runtime_error {
 public:
  enum class Kind {
    Refused,       ///< the request itself is wrong, or the host says no to it
    NotFound,      ///< the object is gone
    WrongObject,   ///< the object is of another kind
    NotSupported,  ///< this object has no such thing
    Exists,        ///< the object is there already
    Failed,        ///< the host's file cannot be used
    Damaged,       ///< what is in the file makes no sense; the choke point adds which file
    Answered,      ///< the description's answers say so
  };
  /// Which exception of the control library shows the failure. A lookup turns Usual into CoreCtlException.
  enum class Thrown { Usual, NodeCtlException, CoreCtlException };

  Error(Kind kind, const std::string& text) : std::runtime_error(text), kind_(kind) {}
  Error(Thrown thrown, const std::string& text)
      : std::runtime_error(text), kind_(Kind::Answered), thrown_(thrown) {}
  explicit Error(std::uint32_t imaStatus)
      : std::runtime_error("answered so by the host description"),
        kind_(Kind::Answered),
        answer_(imaStatus) {}

  Kind GetKind() const { return kind_; }
  Thrown GetThrown() const { return thrown_; }
  /// The status with which an IMA call shows this failure; never 0.
  std::uint32_t ImaStatus() const;

 private:
  Kind kind_;
  Thrown thrown_ = Thrown::Usual;
  std::uint32_t answer_ = 0;
};

}  // namespace host

#pragma GCC visibility pop

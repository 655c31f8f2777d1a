#include "store/Error.h"

#include <cerrno>
#include <cstddef>
#include <iterator>

namespace store {

namespace {

using Kind = Error::Kind;

/// In the order of Kind.
constexpr struct {
  Kind kind;
  std::string_view code;
} kKinds[] = {
    {Kind::Failed, "failed"},
    {Kind::NotFound, "not-found"},
    {Kind::Exists, "exists"},
    {Kind::Invalid, "invalid"},
    {Kind::OutOfRange, "out-of-range"},
    {Kind::NotSettable, "not-settable"},
    {Kind::NotSupported, "not-supported"},
    {Kind::WrongObject, "invalid"},
    {Kind::WrongState, "wrong-state"},
    {Kind::InUse, "in-use"},
    {Kind::TooMany, "too-many"},
    {Kind::Busy, "busy"},
    {Kind::Denied, "denied"},
    {Kind::Damaged, "damaged"},
    {Kind::DamagedFile, "damaged"},
    {Kind::NoSpace, "no-space"},
    {Kind::NoMemory, "no-memory"},
    {Kind::LoginRefused, "login-refused"},
    {Kind::NoAnswer, "no-answer"},
};
constexpr bool AreInOrder() {
  for (std::size_t i = 0; i < std::size(kKinds); ++i) {
    if (static_cast<std::size_t>(kKinds[i].kind) != i) return false;
  }
  return true;
}
static_assert(AreInOrder());

}  // namespace

Kind Error::KindOfSystem(int error) {
  switch (error) {
    case EACCES:
    case EPERM:
    case EROFS:
    case ELOOP:
      return Kind::Denied;
    case ENOSPC:
    case EDQUOT:
    case EFBIG:
      return Kind::NoSpace;
    case ENOENT:
    case ENOTDIR:
      return Kind::NotFound;
    case EBUSY:
    case EWOULDBLOCK:
      return Kind::Busy;
    default:
      return Kind::Failed;
  }
}

std::string_view Error::Code() const { return kKinds[static_cast<std::size_t>(kind_)].code; }

}  // namespace store

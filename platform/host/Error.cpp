#include "host/Error.h"

#include <ima/ima.h>

namespace host {

std::uint32_t Error::ImaStatus() const {
  switch (kind_) {
    case Kind::Refused:
    case Kind::Exists:
      return IMA_ERROR_INVALID_PARAMETER;
    case Kind::NotFound:
      return IMA_ERROR_OBJECT_NOT_FOUND;
    case Kind::WrongObject:
      return IMA_ERROR_INCORRECT_OBJECT_TYPE;
    case Kind::NotSupported:
      return IMA_ERROR_NOT_SUPPORTED;
    case Kind::Answered:
      return answer_ != 0 ? answer_ : IMA_ERROR_UNKNOWN_ERROR;
    case Kind::Failed:
    case Kind::Damaged:
      break;
  }
  return IMA_ERROR_UNEXPECTED_OS_ERROR;
}

}  // namespace host

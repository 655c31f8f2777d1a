#include <CoreCtl/Exception.h>

#include "host/CallLog.h"

namespace NodeCtl::Lib {

NodeCtlException::NodeCtlException(std::string message, NoticeMessage notice)
    : message_(std::move(message)), notice_(std::move(notice)) {
  // Front ends make them too, for values that they cannot convert.
  host::CallLog::Current().Refused(message_);
}
NodeCtlException::NodeCtlException(const NodeCtlException&) = default;
NodeCtlException& NodeCtlException::operator=(const NodeCtlException&) = default;
NodeCtlException::~NodeCtlException() = default;
std::string NodeCtlException::GetDescription(int) const { return message_; }
const char* NodeCtlException::what() const noexcept { return message_.c_str(); }

}  // namespace NodeCtl::Lib

namespace CoreCtl::Lib {

CoreCtlException::CoreCtlException(std::string message, std::string sourceFile, int line,
                                   NodeCtl::Lib::NoticeMessage notice)
    : NodeCtlException(std::move(message), std::move(notice)),
      sourceFile_(std::move(sourceFile)),
      line_(line) {}
CoreCtlException::CoreCtlException(const CoreCtlException&) = default;
CoreCtlException& CoreCtlException::operator=(const CoreCtlException&) = default;
CoreCtlException::~CoreCtlException() = default;

}  // namespace CoreCtl::Lib

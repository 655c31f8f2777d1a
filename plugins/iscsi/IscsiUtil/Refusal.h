/// How the plug-in itself refuses a value.
#pragma once

#include <CoreCtl/Exception.h>

#include <string>

namespace IscsiUtil {

/// Throws CoreCtlException with @p text, and the caller's line. @p source is the folder or file that the
/// exception names, from the root of the sources. The builtin stands for std::source_location, which clang 14
/// does not have.
[[noreturn]] inline void Refuse(const std::string& text, const char* source = "plugins/iscsi/IscsiUtil",
                                int line = __builtin_LINE()) {
  throw CoreCtl::Lib::CoreCtlException(text, source, line, NodeCtl::Lib::NoticeMessage());
}

}  // namespace IscsiUtil

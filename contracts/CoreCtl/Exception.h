/// The exception of lookups and conversions.
#pragma once

#include <NodeCtl/Exception.h>

#include <string>

#pragma GCC visibility push(default)

namespace CoreCtl::Lib {

/// Thrown, by value, by lookups, and by front ends for values that they cannot convert. A handler for
/// NodeCtlException takes it too. Operations on an adapter throw that one.
class CoreCtlException : public NodeCtl::Lib::NodeCtlException {
 public:
  /// @p sourceFile and @p line (counted from 1) tell where it was thrown; they are not part of the text.
  CoreCtlException(std::string message, std::string sourceFile, int line, NodeCtl::Lib::NoticeMessage notice);
  CoreCtlException(const CoreCtlException&);
  CoreCtlException& operator=(const CoreCtlException&);
  ~CoreCtlException() override;

  /// As given; valid as long as the object.
  const std::string& GetSourceFile() const { return sourceFile_; }
  int GetLine() const { return line_; }

 private:
  std::string sourceFile_;
  int line_;
};

}  // namespace CoreCtl::Lib

#pragma GCC visibility pop

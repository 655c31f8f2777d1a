/// The exception of the storage control library.
#pragma once

#include <exception>
#include <string>
#include <utility>
#include <vector>

#pragma GCC visibility push(default)

namespace NodeCtl::Lib {

/// A message that a front end may show in the user's own language: the key of a text in a catalogue, and
/// the named values that go into it. An empty one stands for no such message.
class NoticeMessage {
 public:
  NoticeMessage() = default;
  NoticeMessage(std::string key, std::vector<std::pair<std::string, std::string>> arguments)
      : key_(std::move(key)), arguments_(std::move(arguments)) {}

  /// The key of the text; empty for no message.
  const std::string& GetKey() const { return key_; }
  /// Names and values, in the order in which they were given.
  const std::vector<std::pair<std::string, std::string>>& GetArguments() const { return arguments_; }

 private:
  std::string key_;
  std::vector<std::pair<std::string, std::string>> arguments_;
};

/// What the operations of the library throw, by value. Its text, UTF-8 in whole sentences without a line
/// break at the end, is shown to the user as it is; it tells what was refused and why, and no secret. Copying
/// one never throws anything but std::bad_alloc.
class NodeCtlException : public std::exception {
 public:
  /// @p message is the text of the exception. An empty @p notice stands for none.
  NodeCtlException(std::string message, NoticeMessage notice);
  NodeCtlException(const NodeCtlException&);
  NodeCtlException& operator=(const NodeCtlException&);
  ~NodeCtlException() override;

  /// The whole text. @p form selects among forms of it; 0, the text as it was given, is the only one
  /// defined, and any other number yields the same.
  virtual std::string GetDescription(int form) const;
  /// Valid as long as the object.
  const NoticeMessage& GetNotice() const { return notice_; }
  /// The text of GetDescription(0); valid as long as the object.
  const char* what() const noexcept override;

 private:
  std::string message_;
  NoticeMessage notice_;
};

}  // namespace NodeCtl::Lib

#pragma GCC visibility pop

#include <CoreCtl/Util.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <fstream>

#include "host/Storage.h"
#include "support/FailingCall.h"
#include "support/Harness.h"

using CoreCtl::Util::EnvironmentVarFile;
using NodeCtl::Lib::NodeCtlException;
using testing::AllOf;
using testing::HasSubstr;
using testing::ThrowsMessage;

namespace {

constexpr const char* kPath = "/etc/tessaro/names";

/// A host with one file in it.
class EnvironmentFile : public testing::Test {
 protected:
  std::string File() const { return root_.Path() + kPath; }

  void Write(const std::string& contents) {
    std::filesystem::create_directories(root_.Path() + "/etc/tessaro");
    std::ofstream(File()) << contents;
  }

  std::string Contents() const { return root_.Read(kPath); }

  static void Store(const std::string& name, const std::string& value) {
    EnvironmentVarFile file(kPath);
    file.Parse();
    file.Set(name, value);
    file.Save();
  }

  TemporaryRoot root_;
  Harness host_{"{}"};
};

TEST_F(EnvironmentFile, SetKeepsEverythingElse) {
  const struct {
    const char* name;
    std::string before, after;
  } cases[] = {
      {"no file", "", "A='x y'\n"},
      {"other lines", "# why\n\n#A=1\nAA=1\n", "# why\n\n#A=1\nAA=1\nA='x y'\n"},
      {"every assignment", "A=1\nB=2\nA=3\n", "A='x y'\nB=2\nA='x y'\n"},
      {"a comment behind", "A=\"old value\"  # why\n", "A='x y'  # why\n"},
      {"a mark that is no comment", "A=a#b\n", "A='x y'\n"},
      {"more words", "A=1 2\n", "A='x y'\n"},
      {"indented and exported", "  export\tA=1\r\n", "  export\tA='x y'\r\n"},
      {"quotes with escapes", "A=\"a\\\"b\"'c'\\ d\nB=2\n", "A='x y'\nB=2\n"},
      {"no last line break", "B=1", "B=1\nA='x y'\n"},
      {"its own last line", "A=1", "A='x y'"},
  };
  for (const auto& [name, before, after] : cases) {
    Write(before);
    Store("A", "x y");
    EXPECT_EQ(Contents(), after) << name;
  }
}

TEST_F(EnvironmentFile, AShellReadsWhatWasSet) {
  for (const std::string& value :
       std::vector<std::string>{"iqn.2001-04.com.example:host1", "", "it's", "$HOME `x` \\", "a\"b;c&d|e>f*",
                                "~", "#x", "\t \x01\xc3\xbc", "a=b"}) {
    Store("InitiatorName", value);
    std::string read;
    FILE* shell = popen((". " + File() + " && printf %s \"$InitiatorName\"").c_str(), "r");
    for (int c; (c = std::fgetc(shell)) != EOF;) read += static_cast<char>(c);
    EXPECT_EQ(pclose(shell), 0);
    EXPECT_EQ(read, value);
  }
}

TEST_F(EnvironmentFile, RefusesWhatItCannotKeep) {
  EnvironmentVarFile file(kPath);
  Write("A=1\n");
  file.Parse();
  for (const std::string line : {"B", "1B=2", "B =2", "=2", "B='2", "B=\"2\\\"", "B=2\\", "export"}) {
    Write("A=1\n" + line + "\nC=3\n");
    EXPECT_THAT([&] { file.Parse(); },
                ThrowsMessage<NodeCtlException>(AllOf(HasSubstr(File()), HasSubstr("line 2"))))
        << line;
  }
  for (const char* name : {"", "1A", "A B", "A=", "\u00e4"}) {
    EXPECT_THROW(file.Set(name, "x"), NodeCtlException) << name;
  }
  EXPECT_THROW(file.Set("A", "x\ny"), NodeCtlException);
  EXPECT_THROW(file.Set("A", std::string(1, '\0')), NodeCtlException);
  // It still holds what was read before.
  file.Save();
  EXPECT_EQ(Contents(), "A=1\n");
}

// A failure that is seen through to the disk; the file is the old one or the new one, and nothing is beside
// it.
TEST_F(EnvironmentFile, AFailedCallIsTold) {
  const struct {
    const char* call;
    int number;
    int error;
    std::string reason;
    const char* contents;
  } cases[] = {
      {"fsync", 1, EIO, " cannot be written: Input/output error.", "A=1\n"},
      {"fsync", 2, EIO, " is in its place, but its folder cannot be synced: Input/output error.", "A=2\n"},
  };
  for (const auto& [call, number, error, reason, contents] : cases) {
    Write("A=1\n");
    const FailingCall fault(call, number, error);
    EXPECT_THAT([] { Store("A", "2"); }, ThrowsMessage<NodeCtlException>("The file " + File() + reason));
    EXPECT_EQ(Contents(), contents) << reason;
    EXPECT_FALSE(std::filesystem::exists(root_.Path() + "/etc/tessaro/.names.new"));
  }
  {
    const FailingCall fault("fchown", 1, EPERM);
    EXPECT_THAT(
        [&] { host::NewFile(File()).SetOwnerAndMode(geteuid() + 1, 0, 0600); },
        ThrowsMessage<host::Error>(HasSubstr(" cannot be given to its owner: Operation not permitted.")));
  }
  {
    const FailingCall fault("mkdir", 1, EDQUOT);
    std::filesystem::remove_all(root_.Path() + "/etc");
    EXPECT_THAT([] { Store("A", "2"); },
                ThrowsMessage<NodeCtlException>("The folder " + root_.Path() +
                                                "/etc cannot be made: Disk quota exceeded."));
  }
  Write("A=1\n");
  std::filesystem::remove(File());
  const FailingCall fault("renameat2", 1, ENOSPC);
  EXPECT_THAT([&] { host::NewFile(File()).Publish(); },
              ThrowsMessage<host::Error>(HasSubstr(" cannot be written: No space left on device.")));
}

}  // namespace

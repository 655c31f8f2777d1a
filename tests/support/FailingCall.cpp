#include "support/FailingCall.h"

#include <dlfcn.h>
#include <stdio.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <type_traits>

namespace {

const char* failing = nullptr;
int countdown = 0;
int reason = 0;

/// The system's own @p function, which goes by @p name, unless it is to fail.
template <class... Parameters>
int Call(const char* name, int (*)(Parameters...), std::type_identity_t<Parameters>... arguments) {
  if (failing != nullptr && std::strcmp(failing, name) == 0 && --countdown == 0) {
    errno = reason;
    return -1;
  }
  return reinterpret_cast<int (*)(Parameters...)>(dlsym(RTLD_NEXT, name))(arguments...);
}

}  // namespace

// What the libraries call is this, where it is visible to them.
#pragma GCC visibility push(default)
extern "C" int fsync(int file) { return Call("fsync", fsync, file); }
extern "C" int fchown(int file, uid_t owner, gid_t group) noexcept {
  return Call("fchown", fchown, file, owner, group);
}
extern "C" int mkdir(const char* name, mode_t mode) noexcept { return Call("mkdir", mkdir, name, mode); }
extern "C" int renameat2(int oldFolder, const char* oldName, int newFolder, const char* newName,
                         unsigned flags) noexcept {
  return Call("renameat2", renameat2, oldFolder, oldName, newFolder, newName, flags);
}
#pragma GCC visibility pop

FailingCall::FailingCall(const char* name, int number, int error) {
  failing = name;
  countdown = number;
  reason = error;
}
FailingCall::~FailingCall() { failing = nullptr; }

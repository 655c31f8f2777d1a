/// Calls of the system that fail where a test wants it: a disk that gives up cannot be had for the asking.
#pragma once

/// Makes call @p number from now (1 is the next) of fsync, fchown, mkdir or renameat2 fail with @p error; @p
/// name must outlive the object. At most one such object lives at a time.
class FailingCall {
 public:
  FailingCall(const char* name, int number, int error);
  FailingCall(const FailingCall&) = delete;
  FailingCall& operator=(const FailingCall&) = delete;
  ~FailingCall();
};

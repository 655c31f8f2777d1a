/// The iSCSI sessions of this machine's kernel, as /sys/class/iscsi_session has them.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#pragma GCC visibility push(default)

namespace linux {

/// A connection; numbers are 0 where the kernel tells none.
struct Connection {
  int number = 0;
  std::string state;    // such as "up" or "failed"
  std::string address;  // where it goes to; empty while there is no connection
  std::int64_t port = 0;
  std::string persistentAddress;  // where it was told to go, from where a target may have sent it on
  std::int64_t persistentPort = 0;
  std::int64_t localPort = 0;
  bool headerDigest = false;
  bool dataDigest = false;
  std::int64_t maxReceive = 0;   // bytes: the initiator's MaxRecvDataSegmentLength
  std::int64_t maxTransmit = 0;  // bytes: the target's
};

/// A session with the values that were agreed on.
struct Session {
  int number = 0;  // as in "session1"
  std::string target;
  std::string initiator;
  std::string interface;  // the interface record that it was made by
  std::string localAddress;
  std::string state;  // "LOGGED_IN", "FAILED", "FREE"
  std::string user;   // the CHAP name that it was made with; empty without CHAP
  int portalGroup = 0;
  bool immediateData = false;
  bool initialR2T = false;
  std::int64_t firstBurst = 0;  // bytes
  std::int64_t maxBurst = 0;    // bytes
  std::int64_t maxOutstandingR2T = 0;
  std::int64_t errorRecoveryLevel = 0;
  bool dataPduInOrder = false;
  bool dataSequenceInOrder = false;
  std::int64_t recoveryTimeout = 0;     // seconds
  std::vector<Connection> connections;  // by number
};

/// All of them, by number. One that ends meanwhile is left out.
std::vector<Session> ReadSessions();

}  // namespace linux

#pragma GCC visibility pop

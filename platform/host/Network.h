/// The network that the adapters see: the one place where a host asks something of a target.
///
/// Each operation is one exchange with one portal. Following a portal to where it points, choosing portals
/// and ways out, and keeping what came of it is the business of the caller; a Network has nothing of the host
/// in it but what a request says.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#pragma GCC visibility push(default)

namespace host {

/// How one side of a login stands to something that it may do or not; the words are kDemands.
enum class Demand : std::uint8_t { Prohibited, Discouraged, Preferred, Required };

struct Portal {
  std::string host;  // an address, or a name
  std::int64_t port = 3260;
  bool operator==(const Portal&) const = default;
};

// How an exchange ended, as a login status word: the source in bits 31 to 16, below them the Status-Class and
// Status-Detail of RFC 7143 section 11.13.5 where the target has spoken.

constexpr std::uint32_t LoginResponse(std::uint32_t classAndDetail) { return 0x00050000u | classAndDetail; }

inline constexpr std::uint32_t kDone = 0;
inline constexpr std::uint32_t kMovedTemporarily = LoginResponse(0x0101);
inline constexpr std::uint32_t kMovedPermanently = LoginResponse(0x0102);
inline constexpr std::uint32_t kNotAuthenticated = LoginResponse(0x0201);
inline constexpr std::uint32_t kNotAllowed = LoginResponse(0x0202);
inline constexpr std::uint32_t kNotFound = LoginResponse(0x0203);
inline constexpr std::uint32_t kNameMissing = LoginResponse(0x0207);
inline constexpr std::uint32_t kOutOfResources = LoginResponse(0x0302);
/// The network was not asked, or not yet: see Exchanges.
inline constexpr std::uint32_t kNotAsked = 0xffffffffu;
/// Nothing answered.
inline constexpr std::uint32_t kNoAnswer = 0x00010000u;
/// The adapter has no network portal to go out by.
inline constexpr std::uint32_t kNoWayOut = 0x00020000u;
// The initiator itself ended the login: the target did not prove who it is, does no CHAP where it has to be,
// or agrees to no digest that the initiator takes.
inline constexpr std::uint32_t kTargetUnproven = 0x00060201u;
inline constexpr std::uint32_t kTargetWithoutChap = 0x00060202u;
inline constexpr std::uint32_t kNoCommonDigest = 0x00060203u;
/// The initiator has such a session already, as somebody else was faster.
inline constexpr std::uint32_t kSessionExists = 0x00060204u;

struct ChapEntry {
  Demand demand = Demand::Prohibited;
  std::string name;
  std::string secret;
  bool operator==(const ChapEntry&) const = default;
};

/// What the initiator brings to the security stage.
struct ChapSettings {
  ChapEntry uni;     // the target asks the initiator
  ChapEntry mutual;  // the initiator asks the target too
  bool operator==(const ChapSettings&) const = default;
};

/// What one side brings to the operational stage: RFC 7143 section 13. Truth values are 0 and 1.
struct OperationalParameters {
  std::uint32_t maxConnections = 1;
  std::uint32_t initialR2T = 1;
  std::uint32_t immediateData = 1;
  std::uint32_t maxBurstLength = 262144;          // bytes
  std::uint32_t firstBurstLength = 65536;         // bytes
  std::uint32_t maxRecvDataSegmentLength = 8192;  // bytes
  std::uint32_t defaultTime2Wait = 2;             // seconds
  std::uint32_t defaultTime2Retain = 20;          // seconds
  std::uint32_t maxOutstandingR2T = 1;
  std::uint32_t dataPduInOrder = 1;
  std::uint32_t dataSequenceInOrder = 1;
  std::uint32_t errorRecoveryLevel = 0;
  Demand headerDigest = Demand::Prohibited;
  Demand dataDigest = Demand::Prohibited;
  bool operator==(const OperationalParameters&) const = default;
};

/// What the initiator goes by itself, and the target is not told.
struct Conduct {
  std::uint32_t loginRetries = 4;   // how often a login that nobody answers is tried anew
  std::uint32_t maxCommands = 128;  // at most so many commands at a time
  std::uint32_t loginTimeout = 15;  // seconds, as all below
  std::uint32_t logoutTimeout = 15;
  std::uint32_t noopOutInterval = 15;
  std::uint32_t noopOutTimeout = 10;
  std::uint32_t recoveryTimeout = 10;
  bool operator==(const Conduct&) const = default;
};

/// From whom, where to, and with which proof.
struct Request {
  std::string adapter;    // its name
  std::string way;        // the NIC or the adapter's own portal to go out by; empty where it has no name
  std::string initiator;  // its iSCSI name
  std::string from;       // the address to go out by; empty for any
  Portal portal;
  ChapSettings chap;
  Conduct conduct;
  bool operator==(const Request&) const = default;
};

struct LoginRequest : Request {
  std::string target;
  std::string isid;  // twelve hexadecimal digits
  OperationalParameters offer;
  bool operator==(const LoginRequest&) const = default;
};

struct LogoutRequest {
  std::string initiator;
  std::string target;
  std::string isid;
  int tsih = 0;
  std::int64_t session = 0;  // its id: of a machine's, where one tells of its sessions
  bool operator==(const LogoutRequest&) const = default;
};

struct Answer {
  std::uint32_t status = kDone;
  std::optional<Portal> movedTo;  // with kMovedTemporarily and kMovedPermanently
};

struct FoundPortal {
  Portal portal;
  int tag = 1;  // of its portal group
};
struct FoundTarget {
  std::string name;
  std::string alias;
  std::vector<FoundPortal> portals;
};
struct SendTargetsAnswer : Answer {
  std::vector<FoundTarget> targets;
};

struct LoginAnswer : Answer {
  bool chap = false;  // the initiator was asked who it is
  std::string alias;  // of the target; empty where it tells none
  int portalGroupTag = 1;
  int tsih = 0;  // other than 0 after a login
  /// What the target brings. A network that has negotiated by itself gives what was agreed on.
  OperationalParameters offer;
  std::int64_t session = 0;  // the id of a machine's session, where one tells of them
};

class Network {
 public:
  Network() = default;
  Network(const Network&) = delete;
  Network& operator=(const Network&) = delete;
  virtual ~Network() = default;

  /// True where an exchange takes time. Then none happens while a transaction is open: the operation that
  /// asks runs once to plan them, and once more with the answers (Exchanges.h). The answers of a network that
  /// does not wait are a part of the operation's one transaction.
  virtual bool DoesWait() const = 0;
  /// True where an adapter without bound NICs has a way out too.
  virtual bool FindsWays() const { return false; }

  // Each ends within a time of its own; what comes of one login alone is told by its status, and what is no
  // answer of the other side, such as a program that is missing, is an Error.

  /// A discovery session with one portal.
  virtual SendTargetsAnswer SendTargets(const Request& request) = 0;
  /// The leading connection of a normal session with a target at one portal.
  virtual LoginAnswer Login(const LoginRequest& request) = 0;
  /// Ends a session; what the target says to it changes nothing.
  virtual void Logout(const LogoutRequest& request) = 0;
};

}  // namespace host

#pragma GCC visibility pop

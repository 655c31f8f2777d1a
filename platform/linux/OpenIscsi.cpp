#include "linux/OpenIscsi.h"

#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <thread>

#include "host/Storage.h"
#include "linux/Attributes.h"
#include "linux/Joined.h"
#include "linux/Machine.h"
#include "linux/Program.h"
#include "linux/Sessions.h"

namespace linux {

namespace {

// What iscsiadm(8) ends with.
constexpr int kTransportError = 4;
constexpr int kLoginFailed = 5;
constexpr int kTimedOut = 8;
constexpr int kPduTimedOut = 11;
constexpr int kSessionExists = 15;
constexpr int kNotRoot = 13;
constexpr int kNoDaemon[] = {18, 20};
constexpr int kFatalLogin = 19;
constexpr int kNothingFound = 21;
constexpr int kNotAuthorized = 24;

constexpr const char* kAutomatic = "automatic";
constexpr const char* kManual = "manual";

/// As iscsiadm takes a portal.
std::string Text(const host::Portal& portal) {
  const bool isIpv6 = portal.host.find(':') != portal.host.npos;
  return Joined({isIpv6 ? "[" : "", portal.host, isIpv6 ? "]:" : ":", std::to_string(portal.port)});
}

/// The last line of what a program complained about, which says most.
std::string Complaint(const Ended& ended) {
  std::string text = ended.complaints;
  while (!text.empty() && text.back() == '\n') text.pop_back();
  text.erase(0, text.rfind('\n') + 1);
  return text.empty() ? "exit status " + std::to_string(ended.status) : text;
}

[[noreturn]] void FailProgram(const std::string& what, const Ended& ended) {
  if (ended.status == kNotRoot) {
    throw host::Error(host::Error::Kind::Denied, "Only root may ask open-iscsi to " + what + ".");
  }
  if (std::ranges::find(kNoDaemon, ended.status) != std::end(kNoDaemon)) {
    throw host::Error(host::Error::Kind::Failed,
                      "The daemon of open-iscsi does not answer: hcli linux check tells what mends it.");
  }
  throw host::Error(host::Error::Kind::Failed,
                    "open-iscsi could not " + what + ": " + Complaint(ended) + ".");
}

/// The lines with which a record tells of CHAP; @p prefix is such as "node.session.auth.".
void AddChap(const host::ChapSettings& chap, const std::string& prefix, Record& record) {
  const bool isUsed = chap.uni.demand != host::Demand::Prohibited;
  record.emplace_back(prefix + "authmethod", isUsed ? "CHAP" : "None");
  if (!isUsed) return;
  record.emplace_back(prefix + "username", chap.uni.name);
  record.emplace_back(prefix + "password", chap.uni.secret);
  if (chap.mutual.demand == host::Demand::Prohibited) return;
  record.emplace_back(prefix + "username_in", chap.mutual.name);
  record.emplace_back(prefix + "password_in", chap.mutual.secret);
}

/// Keeps other processes of ours from a folder while the object lives.
class FolderLock {
 public:
  FolderLock(const std::string& path, Milliseconds limit)
      : file_(open(path.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)) {
    if (file_ < 0) host::FailFile(path, "locked", errno);
    const auto end = std::chrono::steady_clock::now() + limit;
    while (flock(file_, LOCK_EX | LOCK_NB) != 0) {
      if (std::chrono::steady_clock::now() < end) {
        std::this_thread::sleep_for(kNextTry);
        continue;
      }
      close(file_);
      throw host::Error(host::Error::Kind::Busy,
                        "Another process asks the same portal for its targets: " + path + " stays locked.");
    }
  }
  FolderLock(const FolderLock&) = delete;
  FolderLock& operator=(const FolderLock&) = delete;
  ~FolderLock() { close(file_); }

 private:
  static constexpr Milliseconds kNextTry{5};

  int file_;
};

/// A record that stands in its place while the object lives; then the one that was there before is back, or
/// none.
class RecordInPlace {
 public:
  /// Folders that are empty behind it go up to @p top.
  RecordInPlace(std::string path, std::string top, const Record& record)
      : path_(std::move(path)), top_(std::move(top)), before_(ReadRecord(path_)) {
    WriteRecord(path_, record);
  }
  RecordInPlace(const RecordInPlace&) = delete;
  RecordInPlace& operator=(const RecordInPlace&) = delete;
  ~RecordInPlace() {
    if (isKept_) return;
    try {
      if (before_) {
        WriteRecord(path_, *before_);
      } else {
        RemoveRecord(path_, top_);
      }
    } catch (const std::exception&) {
      // What brought us here is told already, and a record in the wrong place brings no session by itself.
    }
  }

  void Keep(const Record& record) {
    WriteRecord(path_, record);
    isKept_ = true;
  }

 private:
  std::string path_;
  std::string top_;
  std::optional<Record> before_;
  bool isKept_ = false;
};

/// "127.0.0.1:3260,1 iqn...", an IPv6 address in brackets.
void TakeTarget(std::string_view line, host::SendTargetsAnswer& answer) {
  const std::size_t space = line.find(' ');
  const std::size_t comma = line.rfind(',', space);
  const std::size_t colon = line.rfind(':', comma);
  if (space == line.npos || comma == line.npos || colon == line.npos) return;
  host::FoundPortal found;
  found.portal.host = line.substr(0, colon);
  if (found.portal.host.starts_with('[')) found.portal.host = found.portal.host.substr(1, colon - 2);
  std::from_chars(line.data() + colon + 1, line.data() + comma, found.portal.port);
  std::from_chars(line.data() + comma + 1, line.data() + space, found.tag);
  const std::string name(line.substr(space + 1));
  auto target = std::ranges::find(answer.targets, name, &host::FoundTarget::name);
  if (target == answer.targets.end()) target = answer.targets.insert(target, {name, "", {}});
  target->portals.push_back(std::move(found));
}

host::Demand DemandOf(bool isUsed) { return isUsed ? host::Demand::Required : host::Demand::Prohibited; }

/// What came of a login; the agreed values stand for what the target brought to it.
host::LoginAnswer AnswerOf(const Session& session) {
  host::LoginAnswer answer;
  answer.chap = !session.user.empty();
  answer.portalGroupTag = session.portalGroup;
  answer.tsih = session.number;
  answer.session = IdOfSession(session.number);
  host::OperationalParameters& offer = answer.offer;
  offer.initialR2T = session.initialR2T ? 1 : 0;
  offer.immediateData = session.immediateData ? 1 : 0;
  offer.maxBurstLength = static_cast<std::uint32_t>(session.maxBurst);
  offer.firstBurstLength = static_cast<std::uint32_t>(session.firstBurst);
  offer.maxOutstandingR2T = static_cast<std::uint32_t>(session.maxOutstandingR2T);
  offer.dataPduInOrder = session.dataPduInOrder ? 1 : 0;
  offer.dataSequenceInOrder = session.dataSequenceInOrder ? 1 : 0;
  if (session.connections.empty()) return answer;
  const Connection& connection = session.connections.front();
  offer.maxRecvDataSegmentLength = static_cast<std::uint32_t>(connection.maxTransmit);
  offer.headerDigest = DemandOf(connection.headerDigest);
  offer.dataDigest = DemandOf(connection.dataDigest);
  return answer;
}

/// How a login ended that open-iscsi tells a status of, and that the target did not refuse at once.
std::uint32_t StatusOf(const Ended& ended) {
  switch (ended.status) {
    case kNotAuthorized:
      return host::kNotAuthenticated;
    case kTransportError:
    case kTimedOut:
    case kPduTimedOut:
      return host::kNoAnswer;
    default:
      if (ended.timedOut) return host::kNoAnswer;
      FailProgram("log in", ended);
  }
}

/// The same of a session. What open-iscsi calls a failure for good, and is no refusal, is its own doing: the
/// target did not prove who it is, or has no digest in common.
std::uint32_t StatusOf(const Ended& ended, const host::LoginRequest& request) {
  if (ended.status == kLoginFailed) return host::LoginResponse(0x0200);
  if (ended.status != kFatalLogin) return StatusOf(ended);
  if (request.chap.mutual.demand != host::Demand::Prohibited) return host::kTargetUnproven;
  const host::OperationalParameters& offer = request.offer;
  if (offer.headerDigest == host::Demand::Required || offer.dataDigest == host::Demand::Required)
    return host::kNoCommonDigest;
  return host::LoginResponse(0x0200);
}

/// What is left of the CHAP settings with a target that has chosen: open-iscsi itself takes no target without
/// CHAP once it has a secret. Nothing where CHAP has to be, and is not.
std::optional<host::ChapSettings> Chosen(const host::ChapSettings& chap, const FirstAnswer& first) {
  if (first.chap) return chap;
  if (chap.uni.demand == host::Demand::Required || chap.mutual.demand == host::Demand::Required) return {};
  return host::ChapSettings();
}

std::string InterfaceOf(const host::Request& request) { return InterfaceName(request.adapter, request.way); }

/// The interface record by which the request goes out is there, and says what it has to.
void WriteInterface(const host::Request& request) {
  Record record = {{"iface.iscsi_ifacename", InterfaceOf(request)},
                   {"iface.transport_name", "tcp"},
                   {"iface.initiatorname", request.initiator}};
  if (!request.way.empty()) record.emplace_back("iface.net_ifacename", request.way);
  const std::string path = InterfacePath(InterfaceOf(request));
  if (ReadRecord(path) != record) WriteRecord(path, record);
}

/// The record of a login.
Record NodeRecord(const host::LoginRequest& request, const host::ChapSettings& chap, int tag) {
  Record record = {{"node.name", request.target},   {"node.tpgt", std::to_string(tag)},
                   {"node.startup", kManual},       {"iface.iscsi_ifacename", InterfaceOf(request)},
                   {"iface.transport_name", "tcp"}, {"iface.initiatorname", request.initiator}};
  if (!request.way.empty()) record.emplace_back("iface.net_ifacename", request.way);
  record.emplace_back("node.conn[0].address", request.portal.host);
  record.emplace_back("node.conn[0].port", std::to_string(request.portal.port));
  AddChap(chap, "node.session.auth.", record);
  for (const Record& lines :
       {ParameterLines(ValuesOf(request.offer)), ParameterLines(ValuesOf(request.conduct))})
    record.insert(record.end(), lines.begin(), lines.end());
  return record;
}

Record With(Record record, std::string_view name, const std::string& value) {
  std::erase_if(record, [&](const auto& line) { return line.first == name; });
  record.emplace_back(name, value);
  return record;
}

/// All tries together end within the limit: who gives up waiting must not leave the daemon trying.
Record Hurried(const Record& record, Milliseconds limit) {
  constexpr std::string_view kLimit = "node.conn[0].timeo.login_timeout";
  std::int64_t seconds = 15;  // as open-iscsi has it
  const std::string asked = ValueOf(record, kLimit);
  std::from_chars(asked.data(), asked.data() + asked.size(), seconds);
  const std::int64_t most = std::chrono::duration_cast<std::chrono::seconds>(limit).count();
  return With(With(record, "node.session.initial_login_retry_max", "1"), kLimit,
              std::to_string(std::clamp<std::int64_t>(seconds, 1, std::max<std::int64_t>(1, most))));
}

/// The sessions that have come by the interface to the target since @p before was read.
std::vector<Session> NewSessions(const std::vector<Session>& before, const std::string& interface,
                                 const std::string& target) {
  std::vector<Session> sessions = ReadSessions();
  std::erase_if(sessions, [&](const Session& session) {
    return session.target != target || session.interface != interface ||
           std::ranges::find(before, session.number, &Session::number) != before.end();
  });
  return sessions;
}

Ended EndSession(int number, Milliseconds limit) {
  return RunProgram({kIscsiadm, "-m", "session", "-r", std::to_string(number), "--logout"}, limit);
}

/// Ends what a login has left that is told as failed.
void EndSessions(const std::vector<Session>& sessions, Milliseconds limit) noexcept try {
  for (const Session& session : sessions) EndSession(session.number, limit);
} catch (const std::exception&) {
  // It is seen at the next look, and can be ended then.
}

/// Removes our records of nodes with the target that no session stands behind: it would come back.
void RemoveIdle(const host::LogoutRequest& request, const std::vector<Session>& sessions) {
  const std::string folder = Joined({kNodes, "/", request.target});
  for (const std::string& portal : Names(folder)) {
    for (const std::string& interface : Names(folder + "/" + portal)) {
      const std::string path = Joined({folder, "/", portal, "/", interface});
      const Record record = IsOurs(interface) ? ReadRecord(path).value_or(Record()) : Record();
      const bool isUsed = std::ranges::any_of(sessions, [&](const Session& session) {
        return session.target == request.target && session.interface == interface &&
               !session.connections.empty() &&
               session.connections.front().persistentAddress == ValueOf(record, "node.conn[0].address") &&
               std::to_string(session.connections.front().persistentPort) ==
                   ValueOf(record, "node.conn[0].port");
      });
      if (!isUsed && ValueOf(record, "iface.initiatorname") == request.initiator) RemoveRecord(path, kNodes);
    }
  }
}

}  // namespace

host::SendTargetsAnswer OpenIscsi::SendTargets(const host::Request& request) {
  host::SendTargetsAnswer answer;
  const FirstAnswer first = AskFirst(request, {}, limit_);
  static_cast<host::Answer&>(answer) = first.answer;
  if (answer.status != host::kDone) return answer;
  const std::optional<host::ChapSettings> chap = Chosen(request.chap, first);
  if (!chap) answer.status = host::kTargetWithoutChap;
  if (!chap) return answer;
  const std::string interface = InterfaceOf(request);
  WriteInterface(request);
  Record record = {{"discovery.startup", kManual},
                   {"discovery.type", "sendtargets"},
                   {"discovery.sendtargets.address", request.portal.host},
                   {"discovery.sendtargets.port", std::to_string(request.portal.port)},
                   {"discovery.sendtargets.reopen_max", "0"}};
  AddChap(*chap, "discovery.sendtargets.auth.", record);
  const std::string path = SendTargetsPath(request.portal.host, request.portal.port);
  const std::string folder = host::HostPath(path.substr(0, path.rfind('/')));
  host::MakeFoldersFor(folder + "/x");
  const FolderLock lock(folder, limit_);
  // An administrator's own record is put back even where a process was killed meanwhile: by the next one.
  const std::string kept = path + ".kept";
  if (const auto before = ReadRecord(kept)) WriteRecord(path, *before);
  if (const auto before = ReadRecord(path)) WriteRecord(kept, *before);
  std::optional<RecordInPlace> inPlace;
  inPlace.emplace(path, path.substr(0, path.rfind('/')), record);
  const Ended ended = RunProgram({kIscsiadm, "-m", "discoverydb", "-t", "sendtargets", "-p",
                                  Text(request.portal), "-I", interface, "--discover", "-o", "nonpersistent"},
                                 limit_);
  inPlace.reset();
  RemoveRecord(kept, path.substr(0, path.rfind('/')));
  if (ended.status == kNothingFound) return answer;
  if (ended.status != 0) {
    answer.status = StatusOf(ended);
    return answer;
  }
  std::string_view lines = ended.output;
  while (!lines.empty()) {
    const std::string_view line = lines.substr(0, lines.find('\n'));
    lines.remove_prefix(std::min(line.size() + 1, lines.size()));
    TakeTarget(line, answer);
  }
  return answer;
}

host::LoginAnswer OpenIscsi::Login(const host::LoginRequest& request) {
  host::LoginAnswer answer;
  const FirstAnswer first = AskFirst(request, request.target, limit_);
  static_cast<host::Answer&>(answer) = first.answer;
  if (answer.status != host::kDone) return answer;
  const std::optional<host::ChapSettings> chap = Chosen(request.chap, first);
  if (!chap) answer.status = host::kTargetWithoutChap;
  if (!chap) return answer;
  const std::string interface = InterfaceOf(request);
  WriteInterface(request);
  const int tag = first.portalGroupTag.value_or(1);
  const std::string path = NodePath(request.target, request.portal.host, request.portal.port, tag, interface);
  const Record record = NodeRecord(request, *chap, tag);
  const std::vector<Session> before = ReadSessions();
  // Whoever kills this process leaves a session that came back before to come back again.
  const std::optional<Record> old = ReadRecord(path);
  const bool cameBack = old && ValueOf(*old, "node.startup") == kAutomatic;
  RecordInPlace inPlace(path, std::string(kNodes),
                        With(Hurried(record, limit_), "node.startup", cameBack ? kAutomatic : kManual));
  const Ended ended = RunProgram(
      {kIscsiadm, "-m", "node", "-T", request.target, "-p", Text(request.portal), "-I", interface, "--login"},
      limit_ + std::chrono::seconds(1));
  if (ended.status == kSessionExists) {
    answer.status = host::kSessionExists;
    return answer;
  }
  const std::vector<Session> sessions = NewSessions(before, interface, request.target);
  if (ended.status != 0) {
    EndSessions(sessions, limit_);
    answer.status = StatusOf(ended, request);
    return answer;
  }
  if (sessions.empty()) {
    throw host::Error(host::Error::Kind::Failed,
                      "open-iscsi has logged in to " + request.target + ", but the kernel shows no session.");
  }
  try {
    inPlace.Keep(With(record, "node.startup", kAutomatic));
  } catch (const std::exception&) {
    EndSessions(sessions, limit_);
    throw;
  }
  return AnswerOf(sessions.back());
}

void OpenIscsi::Logout(const host::LogoutRequest& request) {
  const std::vector<Session> sessions = ReadSessions();
  const auto session = std::ranges::find(sessions, NumberOfSession(request.session), &Session::number);
  const bool isThere = session != sessions.end() && session->target == request.target;
  if (isThere && !IsOurs(session->interface)) {
    throw host::Error(host::Error::Kind::NotSettable, "Others began the session with " + request.target +
                                                          ", by their interface " + session->interface +
                                                          ": iscsiadm ends it.");
  }
  // After a start of the machine the number may be another initiator's session.
  if (!isThere || session->initiator != request.initiator) return RemoveIdle(request, sessions);
  const Ended ended = EndSession(session->number, limit_);
  if (ended.status != 0 && ended.status != kNothingFound) FailProgram("log out", ended);
  RemoveIdle(request, ReadSessions());
}

}  // namespace linux

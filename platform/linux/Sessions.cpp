#include "linux/Sessions.h"

#include <algorithm>
#include <charconv>

#include "host/Formats.h"
#include "linux/Attributes.h"

namespace linux {

namespace {

constexpr std::string_view kSession = "session";
constexpr std::string_view kConnection = "connection";

/// The number at the end of such a name.
int NumberIn(std::string_view name, std::size_t from) {
  int number = 0;
  std::from_chars(name.data() + from, name.data() + name.size(), number);
  return number;
}

/// The attributes of one object: each is a file in its folder.
class Attributes {
 public:
  explicit Attributes(std::string folder) : folder_(std::move(folder)) {}
  std::string Text(const char* name) const { return Attribute(folder_ + "/" + name); }
  std::int64_t Number(const char* name) const { return NumberAttribute(folder_ + "/" + name); }
  bool Flag(const char* name) const { return Number(name) != 0; }

 private:
  std::string folder_;
};

/// The kernel writes an IPv6 address in full; it is to be the one that RFC 5952 has.
std::string Canonical(const std::string& address) {
  const std::optional<host::Ipv6Bytes> bytes = host::ParseIpv6(address);
  return bytes ? host::FormatIpv6(*bytes) : address;
}

Connection ReadConnection(const std::string& name) {
  const Attributes own("/sys/class/iscsi_connection/" + name);
  Connection connection;
  connection.number = NumberIn(name, name.find(':') + 1);
  connection.state = own.Text("state");
  connection.address = Canonical(own.Text("address"));
  connection.port = own.Number("port");
  connection.persistentAddress = own.Text("persistent_address");
  connection.persistentPort = own.Number("persistent_port");
  connection.localPort = own.Number("local_port");
  connection.headerDigest = own.Flag("header_digest");
  connection.dataDigest = own.Flag("data_digest");
  connection.maxReceive = own.Number("max_recv_dlength");
  connection.maxTransmit = own.Number("max_xmit_dlength");
  return connection;
}

/// The SCSI host of a session is a part of the way to its device: ".../host0/session1/...".
std::string HostOf(const std::string& name) {
  const std::string way = LinkAt("/sys/class/iscsi_session/" + name);
  const std::size_t end = way.find("/" + name + "/");
  if (end == way.npos || end == 0) return {};
  return way.substr(way.rfind('/', end - 1) + 1, end - way.rfind('/', end - 1) - 1);
}

/// Not what it has of secrets: the kernel shows those to root, and they are none of a reader's business.
Session ReadSession(const std::string& name) {
  const Attributes own("/sys/class/iscsi_session/" + name);
  Session session;
  session.number = NumberIn(name, kSession.size());
  session.target = own.Text("targetname");
  session.initiator = own.Text("initiatorname");
  session.interface = own.Text("ifacename");
  session.localAddress = Attribute("/sys/class/iscsi_host/" + HostOf(name) + "/ipaddress");
  session.state = own.Text("state");
  session.user = own.Text("username");
  session.portalGroup = static_cast<int>(own.Number("tpgt"));
  session.immediateData = own.Flag("immediate_data");
  session.initialR2T = own.Flag("initial_r2t");
  session.firstBurst = own.Number("first_burst_len");
  session.maxBurst = own.Number("max_burst_len");
  session.maxOutstandingR2T = own.Number("max_outstanding_r2t");
  session.errorRecoveryLevel = own.Number("erl");
  session.dataPduInOrder = own.Flag("data_pdu_in_order");
  session.dataSequenceInOrder = own.Flag("data_seq_in_order");
  session.recoveryTimeout = own.Number("recovery_tmo");
  return session;
}

}  // namespace

std::vector<Session> ReadSessions() {
  const std::vector<std::string> connections = Names("/sys/class/iscsi_connection", kConnection);
  std::vector<Session> sessions;
  for (const std::string& name : Names("/sys/class/iscsi_session", kSession)) {
    Session session = ReadSession(name);
    if (session.target.empty()) continue;
    const std::string prefix = std::string(kConnection) + name.substr(kSession.size()) + ":";
    for (const std::string& connection : connections) {
      if (connection.starts_with(prefix)) session.connections.push_back(ReadConnection(connection));
    }
    std::ranges::sort(session.connections, {}, &Connection::number);
    sessions.push_back(std::move(session));
  }
  std::ranges::sort(sessions, {}, &Session::number);
  return sessions;
}

}  // namespace linux

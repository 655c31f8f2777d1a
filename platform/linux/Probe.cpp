#include "linux/Probe.h"

#include <fcntl.h>
#include <netdb.h>
#include <poll.h>
#include <sys/random.h>
#include <sys/socket.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <charconv>
#include <memory>
#include <span>
#include <string_view>

namespace linux {

namespace {

using Clock = std::chrono::steady_clock;

// RFC 7143 section 11.12 and 11.13: offsets in the header of a login request and of its response.
constexpr std::size_t kHeaderSize = 48;
constexpr std::uint8_t kLoginRequest = 0x43;  // with the immediate bit
constexpr std::uint8_t kLoginResponse = 0x23;
constexpr std::uint8_t kTransit = 0x80;
constexpr std::uint8_t kToOperational =
    0x81;  // with the transit bit, from the security stage on to the operational one
constexpr std::size_t kDataLength = 5;
constexpr std::size_t kIsid = 8;
constexpr std::size_t kStatus = 36;

// What is offered, in the order of preference, by the host::Demand for CHAP. A target that does none is to
// say so where CHAP is required, too.
constexpr const char* kOffers[] = {"AuthMethod=None", "AuthMethod=None,CHAP", "AuthMethod=CHAP,None",
                                   "AuthMethod=CHAP,None"};

class Connection {
 public:
  explicit Connection(Milliseconds limit) : end_(Clock::now() + limit) {}
  Connection(const Connection&) = delete;
  Connection& operator=(const Connection&) = delete;
  ~Connection() { Close(); }

  bool Open(const host::Request& request) {
    const auto to = Addresses(request.portal.host, std::to_string(request.portal.port), 0);
    const auto from = request.from.empty() ? AddressList(nullptr, freeaddrinfo)
                                           : Addresses(request.from, "0", AI_NUMERICHOST);
    if (!request.from.empty() && from == nullptr) return false;
    for (const addrinfo* address = to.get(); address != nullptr; address = address->ai_next) {
      if (Open(*address, from.get())) return true;
      Close();
    }
    return false;
  }

  bool Send(std::span<const std::uint8_t> bytes) {
    while (!bytes.empty() && Wait(POLLOUT)) {
      const ssize_t sent = send(socket_, bytes.data(), bytes.size(), MSG_NOSIGNAL);
      if (sent < 0 && errno == EINTR) continue;
      if (sent < 0) return false;
      bytes = bytes.subspan(static_cast<std::size_t>(sent));
    }
    return bytes.empty();
  }

  bool Receive(std::span<std::uint8_t> bytes) {
    while (!bytes.empty() && Wait(POLLIN)) {
      const ssize_t received = recv(socket_, bytes.data(), bytes.size(), 0);
      if (received < 0 && errno == EINTR) continue;
      if (received <= 0) return false;
      bytes = bytes.subspan(static_cast<std::size_t>(received));
    }
    return bytes.empty();
  }

 private:
  using AddressList = std::unique_ptr<addrinfo, decltype(&freeaddrinfo)>;

  static AddressList Addresses(const std::string& host, const std::string& port, int flags) {
    addrinfo hints{};
    hints.ai_socktype = SOCK_STREAM;
    hints.ai_flags = flags | AI_NUMERICSERV;
    addrinfo* list = nullptr;
    if (getaddrinfo(host.c_str(), port.c_str(), &hints, &list) != 0) list = nullptr;
    return {list, freeaddrinfo};
  }

  bool Open(const addrinfo& to, const addrinfo* from) {
    socket_ = socket(to.ai_family, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0);
    if (socket_ < 0) return false;
    if (from != nullptr && bind(socket_, from->ai_addr, from->ai_addrlen) != 0) return false;
    if (connect(socket_, to.ai_addr, to.ai_addrlen) == 0) return true;
    if (errno != EINPROGRESS || !Wait(POLLOUT)) return false;
    int error = 0;
    socklen_t size = sizeof error;
    return getsockopt(socket_, SOL_SOCKET, SO_ERROR, &error, &size) == 0 && error == 0;
  }

  bool Wait(short event) const {
    for (;;) {
      const auto left = std::chrono::duration_cast<Milliseconds>(end_ - Clock::now());
      pollfd waited{socket_, event, 0};
      if (left.count() <= 0) return false;
      const int ready = poll(&waited, 1, static_cast<int>(left.count()));
      if (ready >= 0 || errno != EINTR) return ready == 1;
    }
  }

  void Close() {
    if (socket_ >= 0) close(socket_);
    socket_ = -1;
  }

  int socket_ = -1;
  Clock::time_point end_;
};

std::vector<std::uint8_t> FirstRequest(const host::Request& request, const std::string& target) {
  std::string text = "InitiatorName=" + request.initiator + '\0';
  text += target.empty() ? "SessionType=Discovery" : "SessionType=Normal";
  text += '\0';
  if (!target.empty()) text += "TargetName=" + target + '\0';
  text += kOffers[static_cast<std::size_t>(request.chap.uni.demand)];
  text += '\0';
  std::vector<std::uint8_t> bytes(kHeaderSize);
  bytes[0] = kLoginRequest;
  bytes[1] = kToOperational;
  bytes[kDataLength + 1] = static_cast<std::uint8_t>(text.size() >> 8U);
  bytes[kDataLength + 2] = static_cast<std::uint8_t>(text.size());
  // An ISID of the random format that open-iscsi has none of: no session of its own is to be taken for this
  // one.
  std::array<std::uint8_t, 6> isid = {0x80, 'h', 'c'};
  getrandom(isid.data() + 3, 3, 0);
  std::copy(std::begin(isid), std::end(isid), bytes.begin() + kIsid);
  bytes.insert(bytes.end(), text.begin(), text.end());
  bytes.resize((bytes.size() + 3) / 4 * 4);
  return bytes;
}

/// The host and port of "HOST:PORT,TAG", the host in brackets where it is an IPv6 address.
std::optional<host::Portal> PortalIn(std::string_view text) {
  text = text.substr(0, text.find(','));
  host::Portal portal;
  const bool isBracketed = text.starts_with('[');
  const std::size_t end = isBracketed ? text.find(']') : std::min(text.find(':'), text.size());
  if (end == text.npos) return {};
  portal.host = text.substr(isBracketed ? 1 : 0, isBracketed ? end - 1 : end);
  const std::size_t colon = text.find(':', end);
  if (colon != text.npos) std::from_chars(text.data() + colon + 1, text.data() + text.size(), portal.port);
  return portal;
}

/// The keys that matter here, of a text of "KEY=VALUE", each with a zero byte behind it.
void TakeKeys(std::string_view text, FirstAnswer& answer) {
  while (!text.empty()) {
    const std::string_view pair = text.substr(0, text.find('\0'));
    text.remove_prefix(std::min(pair.size() + 1, text.size()));
    const std::string_view value = pair.substr(std::min(pair.find('=') + 1, pair.size()));
    int tag = 0;
    if (pair == "AuthMethod=CHAP") answer.chap = true;
    if (pair.starts_with("TargetAddress=")) answer.answer.movedTo = PortalIn(value);
    if (pair.starts_with("TargetPortalGroupTag=") &&
        std::from_chars(value.data(), value.data() + value.size(), tag).ec == std::errc())
      answer.portalGroupTag = tag;
  }
}

}  // namespace

FirstAnswer AskFirst(const host::Request& request, const std::string& target, Milliseconds limit) {
  FirstAnswer answer;
  Connection connection(limit);
  std::array<std::uint8_t, kHeaderSize> header{};
  if (!connection.Open(request) || !connection.Send(FirstRequest(request, target)) ||
      !connection.Receive(header) || header[0] != kLoginResponse)
    return answer;
  std::string text(header[kDataLength] * 65536U + header[kDataLength + 1] * 256U + header[kDataLength + 2],
                   '\0');
  if (!connection.Receive({reinterpret_cast<std::uint8_t*>(text.data()), text.size()})) return answer;
  TakeKeys(text, answer);
  // Who goes on to the next stage at once asks for no proof, whatever method it names.
  answer.chap = answer.chap && (header[1] & kTransit) == 0;
  const std::uint32_t status = header[kStatus] * 256U + header[kStatus + 1];
  answer.answer.status = status == 0 ? host::kDone : host::LoginResponse(status);
  return answer;
}

}  // namespace linux

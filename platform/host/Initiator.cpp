#include "host/Initiator.h"

#include <algorithm>
#include <cstdio>
#include <ctime>
#include <set>

#include "host/Formats.h"
#include "host/LevelSchema.h"
#include "host/Negotiation.h"
#include "host/Storage.h"

namespace host {

namespace {

/// How often a portal may send the initiator to another one: after that it goes round in a circle.
constexpr int kMostMoves = 8;

/// The time of the host's clock, as records hold it.
std::string Now() {
  const std::time_t seconds = std::time(nullptr);
  std::tm time{};
  localtime_r(&seconds, &time);
  char text[32];
  std::strftime(text, sizeof text, "%Y-%m-%d %H:%M:%S", &time);
  return text;
}

/// RFC 7143 section 11.12.5: type 10b in the upper two bits, then 24 bits that stay with the adapter, as if
/// they had been drawn at random for it once, and the qualifier that tells the adapter's sessions with a
/// target apart.
std::string Isid(const Object& adapter, std::uint16_t qualifier) {
  std::uint32_t drawn = 2166136261u;
  for (const char byte : adapter.name + adapter.record.GetString("uid")) {
    drawn = (drawn ^ static_cast<unsigned char>(byte)) * 16777619u;
  }
  char isid[13];
  std::snprintf(isid, sizeof isid, "80%06x%04x", drawn >> 8, unsigned{qualifier});
  return isid;
}

/// The first identifier that none of @p sessions has.
std::string FreeIsid(const Object& adapter, const std::vector<Object>& sessions) {
  std::set<std::string> taken;
  for (const Object& session : sessions) taken.insert(session.record.GetString("isid"));
  for (std::uint16_t qualifier = 1; qualifier != 0; ++qualifier) {
    std::string isid = Isid(adapter, qualifier);
    if (!taken.contains(isid)) return isid;
  }
  throw Error(Error::Kind::TooMany,
              "The adapter " + adapter.name + " has no session identifier left to give.");
}

constexpr std::size_t IndexOfParameter(std::string_view name) {
  std::size_t index = 0;
  while (kParameters[index].name != name) ++index;
  return index;
}

/// What the adapter brings to the negotiation: a parameter that it does not have is at its standard value.
std::uint32_t OfferAt(const Inheritance& levels, std::string_view parameter) {
  const std::size_t index = IndexOfParameter(parameter);
  const std::string path = "parameters/" + std::string(parameter);
  const bool isKnown = !levels.back()->Has(path) || levels.back()->GetBool(path + "/supported");
  const std::int64_t value = isKnown ? ParameterAt(levels, index) : kParameters[index].value;
  return static_cast<std::uint32_t>(std::clamp(value, std::int64_t{0}, kUint32Most));
}

OperationalParameters OfferAt(const Inheritance& levels) {
  OperationalParameters offer;
  for (const NegotiationRule& rule : kNegotiationRules) {
    if (!rule.parameter.empty()) offer.*rule.value = OfferAt(levels, rule.parameter);
  }
  offer.maxRecvDataSegmentLength = OfferAt(levels, "MaxRecvDataSegment");
  offer.headerDigest = DigestAt(levels, 0);
  offer.dataDigest = DigestAt(levels, 1);
  return offer;
}

Conduct ConductAt(const Inheritance& levels) {
  return {.loginRetries = OfferAt(levels, "InitialLoginRetryMax"),
          .maxCommands = OfferAt(levels, "MaxCmds"),
          .loginTimeout = OfferAt(levels, "LoginTimeout"),
          .logoutTimeout = OfferAt(levels, "LogoutTimeout"),
          .noopOutInterval = OfferAt(levels, "NoopOutInterval"),
          .noopOutTimeout = OfferAt(levels, "NoopOutTimeout"),
          .recoveryTimeout = OfferAt(levels, "RecoveryTimeout")};
}

Record SessionOf(const Agreement& agreement) {
  Record session;
  for (const NegotiationRule& rule : kNegotiationRules) {
    const std::uint32_t value = agreement.values.*rule.value;
    if (rule.IsTruth()) {
      session.Set(rule.key, value != 0);
    } else {
      session.Set(rule.key, std::int64_t{value});
    }
  }
  return session;
}

Record ConnectionOf(const Agreement& agreement) {
  Record connection;
  connection.Set("cid", 0);
  connection.Set("headerDigest", agreement.headerDigest ? 1 : 0);
  connection.Set("dataDigest", agreement.dataDigest ? 1 : 0);
  connection.Set("maxRecvDataSegmentLength", std::int64_t{agreement.receives});
  connection.Set("maxTransmitDataSegmentLength", std::int64_t{agreement.transmits});
  const std::string now = Now();
  for (const char* time : {"sessionCreateTime", "connectionCreateTime", "connectionStartTime"}) {
    connection.Set(time, now);
  }
  return connection;
}

/// The routable one of the addresses, or a link-local one where it has no other.
std::string Ipv6In(const Record& record, const std::string& list) {
  std::string best;
  for (std::size_t i = 0; i < record.GetSize(list); ++i) {
    const std::string& address = record.GetString(list + '/' + std::to_string(i) + "/address");
    if (!address.starts_with("fe80:")) return address;
    if (best.empty()) best = address;
  }
  return best;
}

/// A way that has no address at all is not numbered, and goes anywhere. One that has goes by the families of
/// its addresses. @p prefix leads to them in @p record, which may say that a family is switched off.
WayOut WayAt(const std::string& name, const Record& record, const std::string& prefix) {
  const std::string& described = record.GetString(prefix + "ipv4Address");
  const std::string ipv4 = described == "0.0.0.0" ? "" : described;
  const std::string ipv6 = Ipv6In(record, prefix + "ipv6Addresses");
  const bool isNumbered = !ipv4.empty() || !ipv6.empty();
  const auto own = [&](const std::string& address, const char* enabled) -> std::optional<std::string> {
    const bool isOff = record.Has(prefix + enabled) && !record.GetBool(prefix + enabled);
    if (isOff || (isNumbered && address.empty())) return {};
    return address;
  };
  return {.name = name, .ipv4 = own(ipv4, "ipv4Enabled"), .ipv6 = own(ipv6, "ipv6Enabled")};
}

/// The way's own address towards @p host; nothing where it does not lead there.
const std::optional<std::string>& LocalAddress(const WayOut& way, const std::string& host) {
  return ParseIpv6(host) || (!way.ipv4 && !ParseIpv4(host)) ? way.ipv6 : way.ipv4;
}

/// The answer of the portal that the one of @p request leads to, which it is set to. Of an endless way the
/// last answer is that of a portal that points on.
template <class Exchange>
auto Follow(const WayOut& way, Request& request, Exchange exchange) {
  const auto ask = [&] {
    decltype(exchange()) answer{};
    answer.status = kNoAnswer;
    if (const auto& from = LocalAddress(way, request.portal.host)) {
      request.from = *from;
      answer = exchange();
    }
    return answer;
  };
  auto answer = ask();
  for (int moves = 0; answer.movedTo && moves < kMostMoves; ++moves) {
    request.portal = *answer.movedTo;
    answer = ask();
  }
  return answer;
}

/// Of two failures in a row the one to show: the first, but for one without an answer. What a target said
/// tells more than that elsewhere nobody said anything.
std::uint32_t MoreTelling(std::uint32_t first, std::uint32_t next) {
  return first == kNoAnswer ? next : first;
}

bool GoesBy(const Object& session, const WayOut& way) {
  return !session.record.Has("portal") || session.record.GetString("portal") == way.name;
}

}  // namespace

Initiator::Initiator(Tree& tree, const Object& adapter) : tree_(tree), adapter_(adapter) {
  if (adapter.record.GetInt("state") != 0) {
    throw Error(Error::Kind::WrongState, "The adapter " + adapter.name + " is not online.");
  }
  for (Object& sendTarget : tree.Children(adapter.id, Kind::SendTarget)) {
    const std::string name = sendTarget.name;
    sendTargets_.emplace(name, std::move(sendTarget));
  }
  ReadWaysOut();
}

void Initiator::ReadWaysOut() {
  if (adapter_.record.GetString("kind") == "independent") {
    const std::vector<Object> own = tree_.Children(adapter_.id, Kind::LogicalPortal);
    ways_.push_back(WayAt(own.empty() ? "" : own[0].name, adapter_.record, "network/"));
    return;
  }
  for (const Object& portal : tree_.Children(adapter_.id, Kind::NetworkPortal)) {
    const auto nic = tree_.Find(kRoot, Kind::Nic, portal.name);
    const bool isUp = nic && nic->record.GetBool("linkUp");
    ways_.push_back(isUp ? WayAt(portal.name, nic->record, "") : WayOut{.name = portal.name});
  }
  if (ways_.empty() && tree_.GetNetwork().FindsWays()) ways_.push_back({.name = "", .ipv4 = "", .ipv6 = ""});
}

Request Initiator::RequestFor(const Inheritance& levels, const WayOut& way, const Portal& portal) const {
  Request request;
  request.adapter = adapter_.name;
  request.way = way.name;
  request.initiator = adapter_.record.GetString("initiatorName");
  request.portal = portal;
  request.chap = {.uni = ChapAt(levels, 0), .mutual = ChapAt(levels, 1)};
  request.conduct = ConductAt(levels);
  return request;
}

SendTargetsAnswer Initiator::Ask(const Object& sendTarget) {
  SendTargetsAnswer answer;
  answer.status = ways_.empty() ? kNoWayOut : kNoAnswer;
  for (const WayOut& way : ways_) {
    Request request = RequestFor({&sendTarget.record, &adapter_.record}, way,
                                 {sendTarget.record.GetString("host"), sendTarget.record.GetInt64("port")});
    answer = Follow(way, request, [&] { return tree_.GetNetwork().SendTargets(request); });
    if (answer.status != kNoAnswer) break;
  }
  return answer;
}

std::vector<Initiator::Place> Initiator::PlacesOf(const KnownTarget& target) const {
  std::vector<Place> places;
  for (const Record& record : target.portals) {
    Place place{{record.GetString("host"), record.GetInt64("port")}, {&record}};
    const auto parent = sendTargets_.find(ParentOf(record));
    if (parent != sendTargets_.end()) place.levels.push_back(&parent->second.record);
    place.levels.push_back(&adapter_.record);
    places.push_back(std::move(place));
  }
  for (const Record& address : AddressesOf(target)) {
    const bool hasPort = address.GetInt64("portAndTagPresent") == 1;
    const Portal portal{address.GetString("address"), hasPort ? address.GetInt64("port") : 3260};
    const auto isSame = [&](const Place& place) { return place.portal == portal; };
    if (std::none_of(places.begin(), places.end(), isSame)) places.push_back({portal, {&adapter_.record}});
  }
  return places;
}

std::vector<const WayOut*> Initiator::WaysWithout(const std::vector<Object>& sessions) const {
  std::vector<const WayOut*> ways;
  for (const WayOut& way : ways_) {
    const auto goesBy = [&](const Object& session) { return GoesBy(session, way); };
    if (std::none_of(sessions.begin(), sessions.end(), goesBy)) ways.push_back(&way);
  }
  return ways;
}

std::uint32_t Initiator::LoginWhereMissing(KnownTarget& target) {
  std::vector<Object> sessions;
  if (target.object.id != 0) sessions = tree_.Children(target.object.id, Kind::Session);
  if (!sessions.empty() && PlacesOf(target).empty()) return kDone;  // nothing is left to log in at
  const std::vector<const WayOut*> ways = WaysWithout(sessions);
  return ways.empty() && !sessions.empty() ? kDone : LoginByEach(target, ways);
}

std::uint32_t Initiator::LoginOnceMore(KnownTarget& target) {
  const std::vector<Object> sessions = tree_.Children(OwnObject(tree_, target).id, Kind::Session);
  std::vector<const WayOut*> ways = WaysWithout(sessions);
  if (ways.empty() && !ways_.empty()) {
    const auto count = [&](const WayOut& way) {
      return std::count_if(sessions.begin(), sessions.end(),
                           [&](const Object& session) { return GoesBy(session, way); });
    };
    ways = {&*std::min_element(ways_.begin(), ways_.end(),
                               [&](const WayOut& a, const WayOut& b) { return count(a) < count(b); })};
  }
  return LoginByEach(target, ways);
}

std::uint32_t Initiator::LoginBeside(KnownTarget& target, const Object& session) {
  const auto same =
      std::find_if(ways_.begin(), ways_.end(), [&](const WayOut& way) { return GoesBy(session, way); });
  if (same == ways_.end()) return LoginByEach(target, {});
  return LoginByEach(target, {&*same});
}

std::uint32_t Initiator::LoginByEach(KnownTarget& target, const std::vector<const WayOut*>& ways) {
  Object& object = OwnObject(tree_, target);
  std::uint32_t status = ways.empty() ? kNoWayOut : kDone;
  for (const WayOut* way : ways) {
    const std::uint32_t outcome = LoginBy(target, *way);
    if (outcome == kNotAsked) return kNotAsked;  // the ways behind it may depend on what comes of this one
    if (outcome != kDone) status = status == kDone ? outcome : MoreTelling(status, outcome);
  }
  object.record.Set("loginStatus", std::int64_t{status});
  tree_.Update(object);
  return status;
}

std::uint32_t Initiator::LoginBy(KnownTarget& target, const WayOut& way) {
  std::uint32_t status = kNoAnswer;
  for (const Place& place : PlacesOf(target)) {
    const std::uint32_t outcome = LoginAt(target, way, place);
    if (outcome == kDone || outcome == kNotAsked) return outcome;
    status = MoreTelling(status, outcome);
  }
  return status;
}

void Initiator::NoteTag(const KnownTarget& target, const Portal& portal, int tag) {
  Record key;
  key.Set("name", target.object.record.GetString("name"));
  key.Set("host", portal.host);
  key.Set("port", portal.port);
  auto place = tree_.Find(adapter_.id, Kind::StaticTarget, NameOf(Kind::StaticTarget, key));
  if (!place || (place->record.Has("portalGroup") && place->record.GetInt("portalGroup") == tag)) return;
  place->record.Set("portalGroup", tag);
  tree_.Update(*place);
}

std::uint32_t Initiator::LoginAt(KnownTarget& target, const WayOut& way, const Place& place) {
  LoginRequest request;
  static_cast<Request&>(request) = RequestFor(place.levels, way, place.portal);
  request.target = target.object.record.GetString("name");
  request.isid = FreeIsid(adapter_, tree_.Children(target.object.id, Kind::Session));
  request.offer = OfferAt(place.levels);
  const LoginAnswer answer = Follow(way, request, [&] { return tree_.GetNetwork().Login(request); });
  if (answer.status != kDone) return answer.status;
  const auto agreement = Negotiate(request.offer, answer.offer);
  if (!agreement) {
    tree_.GetNetwork().Logout({.initiator = request.initiator,
                               .target = request.target,
                               .isid = request.isid,
                               .tsih = answer.tsih,
                               .session = answer.session});
    return kNoCommonDigest;
  }
  if (!answer.alias.empty()) target.object.record.Set("alias", answer.alias);
  if (request.portal == place.portal) NoteTag(target, place.portal, answer.portalGroupTag);
  Record session = SessionOf(*agreement);
  if (!way.name.empty()) session.Set("portal", way.name);
  session.Set("isid", request.isid);
  session.Set("tsih", answer.tsih);
  session.Set("targetPortalGroupTag", answer.portalGroupTag);
  session.Set("authMethod", answer.chap ? 1 : 0);
  Record connection = ConnectionOf(*agreement);
  const std::pair<const char*, std::string> addresses[] = {{"connectionAddress", place.portal.host},
                                                           {"remoteAddress", request.portal.host},
                                                           {"localAddress", request.from}};
  for (const auto& [key, address] : addresses) {
    if (IpFault(address).empty()) connection.Set(key, address);
  }
  tree_.InsertNew(tree_.InsertNew(target.object.id, Kind::Session, session).id, Kind::Connection, connection);
  return kDone;
}

}  // namespace host

#include "simulator/SimulatedNetwork.h"

#include <algorithm>
#include <map>
#include <set>

#include "host/Formats.h"
#include "host/Storage.h"
#include "host/Tree.h"
#include "simulator/RemoteSchema.h"

namespace simulator {

using namespace host;

namespace {

Portal PortalIn(const Record& record) { return {record.GetString("host"), record.GetInt64("port")}; }

/// As which the portal is found: by any spelling of a host name.
std::string KeyOf(const Portal& portal) { return LowerCase(portal.host) + ' ' + std::to_string(portal.port); }

OperationalParameters OfferOf(const Record& target) {
  OperationalParameters offer;
  const Record parameters = target.GetRecord("parameters");
  for (const NegotiationRule& rule : kNegotiationRules) {
    offer.*rule.value = rule.IsTruth() ? std::uint32_t{parameters.GetBool(rule.key)}
                                       : static_cast<std::uint32_t>(parameters.GetInt64(rule.key));
  }
  offer.maxRecvDataSegmentLength =
      static_cast<std::uint32_t>(parameters.GetInt64("maxRecvDataSegmentLength"));
  offer.headerDigest = static_cast<Demand>(parameters.GetWord("headerDigest", kDemands));
  offer.dataDigest = static_cast<Demand>(parameters.GetWord("dataDigest", kDemands));
  return offer;
}

/// The security stage between what the initiator brings and what the record @p theirs demands. Sets whether
/// the initiator was asked.
std::uint32_t Authenticate(const ChapSettings& own, const Record& theirs, bool& asked) {
  const auto chosen = Choose(own.uni.demand, static_cast<Demand>(theirs.GetWord("level", kDemands)));
  if (!chosen) return own.uni.demand == Demand::Required ? kTargetWithoutChap : kNotAuthenticated;
  asked = *chosen;
  const bool isRight =
      own.uni.name == theirs.GetString("name") && own.uni.secret == theirs.GetString("secret");
  if (asked && !isRight) return kNotAuthenticated;
  // A target proves itself only in answer to a proof.
  const std::string& name = theirs.GetString("mutualName");
  const auto proven =
      Choose(own.mutual.demand, asked && !name.empty() ? Demand::Discouraged : Demand::Prohibited);
  if (!proven) return kTargetUnproven;
  const bool isKnown = own.mutual.name == name && own.mutual.secret == theirs.GetString("mutualSecret");
  return *proven && !isKnown ? kTargetUnproven : kDone;
}

class SimulatedNetwork final : public Network {
 public:
  explicit SimulatedNetwork(host::Tree& tree) : tree_(tree) {}

  bool DoesWait() const override { return false; }

  SendTargetsAnswer SendTargets(const Request& request) override {
    const auto portal = FindPortal(request.portal);
    const std::vector<FoundTarget>* targets = TargetsAt(request.portal);
    SendTargetsAnswer answer;
    if (IsTurnedAway(portal, targets != nullptr, request, answer)) return answer;
    bool asked = false;
    if (portal) answer.status = Authenticate(request.chap, portal->record.GetRecord("chap"), asked);
    if (answer.status == kDone && targets != nullptr) answer.targets = *targets;
    return answer;
  }

  LoginAnswer Login(const LoginRequest& request) override {
    const auto portal = FindPortal(request.portal);
    const auto target = tree_.Find(kRoot, Kind::RemoteTarget, request.target);
    const auto place = target ? PlaceOf(target->record, request.portal) : std::nullopt;
    LoginAnswer answer;
    const bool isThere = place || portal || TargetsAt(request.portal) != nullptr;
    if (IsTurnedAway(portal, isThere, request, answer)) return answer;
    answer.status = place ? Admit(target->record, request, answer) : kNotFound;
    if (answer.status == kDone) answer.portalGroupTag = place->tag;
    return answer;
  }

  void Logout(const LogoutRequest&) override {}  // the target remembers the sessions that the host has

 private:
  std::optional<Object> FindPortal(const Portal& portal) {
    return tree_.Find(kRoot, Kind::RemotePortal, KeyOf(portal));
  }

  /// What happens before anyone looks at what is asked for. Where there is no record of the portal,
  /// @p isThere tells whether anything answers.
  static bool IsTurnedAway(const std::optional<Object>& portal, bool isThere, const Request& request,
                           Answer& answer) {
    if (portal) {
      const Record& record = portal->record;
      if (!record.GetBool("answers")) {
        answer.status = kNoAnswer;
      } else if (record.Has("redirect")) {
        answer.status = record.GetBool("redirect/permanent") ? kMovedPermanently : kMovedTemporarily;
        answer.movedTo = PortalIn(record.GetRecord("redirect"));
      } else if (record.GetInt("status") != 0) {
        answer.status = LoginResponse(static_cast<std::uint32_t>(record.GetInt("status")));
      }
    } else if (!isThere) {
      answer.status = kNoAnswer;
    }
    if (answer.status == kDone && request.initiator.empty()) answer.status = kNameMissing;
    return answer.status != kDone;
  }

  static std::vector<FoundPortal> PortalsOf(const Record& target) {
    std::vector<FoundPortal> portals;
    for (std::size_t i = 0; i < target.GetSize("portals"); ++i) {
      const Record portal = target.GetRecord("portals/" + std::to_string(i));
      portals.push_back({PortalIn(portal), portal.GetInt("tag")});
    }
    return portals;
  }

  static std::optional<FoundPortal> PlaceOf(const Record& target, const Portal& portal) {
    for (FoundPortal& found : PortalsOf(target)) {
      if (KeyOf(found.portal) == KeyOf(portal)) return std::move(found);
    }
    return {};
  }

  /// The targets that the portal tells of; null where no target is. All are read at the first question: a
  /// host asks about many.
  const std::vector<FoundTarget>* TargetsAt(const Portal& portal) {
    if (!targetsAt_) {
      targetsAt_.emplace();
      for (const Object& target : tree_.Children(kRoot, Kind::RemoteTarget)) {
        const FoundTarget found{target.name, target.record.GetString("alias"), PortalsOf(target.record)};
        for (const FoundPortal& at : found.portals) {
          std::vector<FoundTarget>& there = (*targetsAt_)[KeyOf(at.portal)];
          const bool isKnown = !there.empty() && there.back().name == found.name;
          if (target.record.GetBool("reported") && !isKnown) there.push_back(found);
        }
      }
    }
    const auto there = targetsAt_->find(KeyOf(portal));
    return there == targetsAt_->end() ? nullptr : &there->second;
  }

  /// The login itself.
  std::uint32_t Admit(const Record& target, const LoginRequest& request, LoginAnswer& answer) {
    if (const int status = target.GetInt("status"); status != 0) {
      return LoginResponse(static_cast<std::uint32_t>(status));
    }
    for (std::size_t i = 0; i < target.GetSize("refusedInitiators"); ++i) {
      if (target.GetString("refusedInitiators/" + std::to_string(i)) == request.initiator) return kNotAllowed;
    }
    const std::uint32_t status = Authenticate(request.chap, target.GetRecord("chap"), answer.chap);
    if (status != kDone) return status;
    const std::multiset<int> tsihs = SessionsWith(request.target);
    if (tsihs.size() >= static_cast<std::size_t>(target.GetInt("maxSessions"))) return kOutOfResources;
    // Fewer than 65535 sessions leave a number free.
    answer.tsih = 1;
    while (tsihs.contains(answer.tsih)) ++answer.tsih;
    answer.alias = target.GetString("alias");
    answer.offer = OfferOf(target);
    return kDone;
  }

  /// The target's identifiers of all sessions that the adapters of the host have with it.
  std::multiset<int> SessionsWith(const std::string& name) {
    if (adapters_.empty()) adapters_ = tree_.ChildIds(kRoot, Kind::Adapter);
    std::multiset<int> tsihs;
    for (const std::int64_t adapter : adapters_) {
      const auto target = tree_.Find(adapter, Kind::Target, name);
      if (!target) continue;
      for (const Object& session : tree_.Children(target->id, Kind::Session)) {
        tsihs.insert(session.record.GetInt("tsih"));
      }
    }
    return tsihs;
  }

  host::Tree& tree_;
  std::vector<std::int64_t> adapters_;
  std::optional<std::map<std::string, std::vector<FoundTarget>>> targetsAt_;
};

}  // namespace

std::unique_ptr<Network> MakeNetwork(host::Tree& tree) { return std::make_unique<SimulatedNetwork>(tree); }

}  // namespace simulator

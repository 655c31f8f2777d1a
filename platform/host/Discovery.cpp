#include "host/Discovery.h"

#include <algorithm>
#include <map>
#include <set>

#include "host/Adapters.h"
#include "host/Initiator.h"
#include "host/Sessions.h"

namespace host {

namespace {

enum Outcome : int { kCompleted, kTimedOut, kCompletedWithFailures };

/// True when that is a change.
bool SetDiscovered(Record& target, bool discovered) {
  const std::size_t count = target.GetSize("discoveryMethods");
  for (std::size_t i = 0; i < count; ++i) {
    const std::string path = "discoveryMethods/" + std::to_string(i);
    if (target.GetString(path) != "sendtargets") continue;
    if (!discovered) target.Erase(path);
    return !discovered;
  }
  if (discovered) target.Append("discoveryMethods", "sendtargets");
  return discovered;
}

class Discovery {
 public:
  Discovery(Tree& tree, const Object& adapter) : tree_(tree), adapter_(adapter) {}

  Outcome Run() {
    if (!Ask()) return kCompleted;
    SettleTargets(tree_, adapter_.id);
    for (const FoundTarget* target : inOrder_) Take(*target);
    for (const Told& told : told_) Take(told);
    Forget();
    if (LoginAdapter(tree_, adapter_)) Fail(kCompletedWithFailures);
    return outcome_;
  }

 private:
  /// A portal of a target, and by which sendtargets it was told of.
  struct Told {
    Record key;
    int tag;
    std::vector<const Object*> by;
  };

  /// A portal that kept silent says more about a discovery than a login that failed.
  void Fail(Outcome outcome) {
    if (outcome_ != kTimedOut) outcome_ = outcome;
  }

  /// False where not all were asked: the outcome is not known yet.
  bool Ask() {
    Initiator initiator(tree_, adapter_);
    bool areAsked = true;
    sendTargets_ = tree_.Children(adapter_.id, Kind::SendTarget);
    for (const Object& sendTarget : sendTargets_) {
      SendTargetsAnswer answer = initiator.Ask(sendTarget);
      areAsked = areAsked && answer.status != kNotAsked;
      if (answer.status != kDone) {
        silent_.insert(sendTarget.name);
        Fail(answer.status == kNoAnswer || answer.status == kNoWayOut ? kTimedOut : kCompletedWithFailures);
      }
      for (const FoundTarget& target : answer.targets) Note(target, sendTarget);
    }
    return areAsked;
  }

  /// Portals that the adapter cannot be given are passed over, and what is behind no other.
  void Note(FoundTarget target, const Object& sendTarget) {
    const bool hasNone = target.portals.empty();
    std::erase_if(target.portals, [&](const FoundPortal& portal) {
      return !LackedFor(adapter_.record, portal.portal.host).empty();
    });
    if (target.portals.empty() && !hasNone) return;
    const auto [found, isNew] = found_.emplace(target.name, target);
    if (isNew) inOrder_.push_back(&found->second);
    for (const FoundPortal& portal : target.portals) {
      Told told{.key = {}, .tag = portal.tag, .by = {}};
      told.key.Set("name", target.name);
      told.key.Set("host", portal.portal.host);
      told.key.Set("port", portal.portal.port);
      const auto [at, isFirst] = indices_.emplace(NameOf(Kind::StaticTarget, told.key), told_.size());
      if (isFirst) told_.push_back(std::move(told));
      told_[at->second].by.push_back(&sendTarget);
    }
  }

  void Take(const FoundTarget& found) {
    auto target = tree_.Find(adapter_.id, Kind::Target, found.name);
    if (!target) {
      Record given;
      given.Set("name", found.name);
      target = tree_.InsertNew(adapter_.id, Kind::Target, given);
    }
    target->record.Set("alias", found.alias);
    SetDiscovered(target->record, true);
    tree_.Update(*target);
  }

  /// A static target stays one besides. Where several tell of a portal, it stays with the one that it was
  /// found through, as what is set there is inherited.
  void Take(const Told& told) {
    auto place = tree_.Find(adapter_.id, Kind::StaticTarget, NameOf(Kind::StaticTarget, told.key));
    if (!place) {
      Record given = told.key;
      SetOrigin(given, *told.by.front());
      given.Set("portalGroup", told.tag);
      tree_.InsertNew(adapter_.id, Kind::StaticTarget, given);
      return;
    }
    const std::string origin = OriginOf(place->record);
    const auto isOrigin = [&](const Object* by) { return by->name == origin; };
    const bool isKept = silent_.contains(origin) || std::any_of(told.by.begin(), told.by.end(), isOrigin);
    if (origin.empty()) place->record.Set("static", true);
    if (!isKept) SetOrigin(place->record, *told.by.front());
    place->record.Set("portalGroup", told.tag);
    tree_.Update(*place);
  }

  static void SetOrigin(Record& place, const Object& sendTarget) {
    Record origin;
    origin.Set("host", sendTarget.record.GetString("host"));
    origin.Set("port", sendTarget.record.GetInt64("port"));
    place.Set("sendTarget", origin);
  }

  /// Takes out what was found and is told of no more, and what nothing leads to.
  void Forget() {
    std::set<std::string> untold;  // targets
    for (Object& place : tree_.Children(adapter_.id, Kind::StaticTarget)) {
      const std::string origin = OriginOf(place.record);
      const std::string& name = place.record.GetString("name");
      if (origin.empty() || indices_.contains(place.name) || silent_.contains(origin)) continue;
      const auto target = tree_.Find(adapter_.id, Kind::Target, name);
      if (target && HasSession(tree_, *target)) continue;
      untold.insert(name);
      if (!IsStatic(place.record)) {
        tree_.Remove(place.id);
        continue;
      }
      for (const char* mark : {"sendTarget", "static"}) place.record.Erase(mark);
      tree_.Update(place);
    }
    for (Object& target : tree_.Children(adapter_.id, Kind::Target)) {
      // Some have their word from the sendtargets alone, and it is not known from which.
      const bool isUntold =
          !found_.contains(target.name) && (silent_.empty() || untold.contains(target.name));
      if (isUntold && !HasSession(tree_, target) && SetDiscovered(target.record, false)) tree_.Update(target);
      ForgetTarget(tree_, target);
    }
  }

  Tree& tree_;
  const Object& adapter_;
  Outcome outcome_ = kCompleted;
  std::vector<Object> sendTargets_;
  std::set<std::string> silent_;  // the sendtargets that told nothing
  std::map<std::string, FoundTarget> found_;
  std::vector<const FoundTarget*> inOrder_;
  std::vector<Told> told_;
  std::map<std::string, std::size_t> indices_;  // of told_, by the name of the place
};

}  // namespace

void Rediscover(Tree& tree, const Object& adapter) {
  const Outcome outcome = Discovery(tree, adapter).Run();
  Object changed = tree.Get(adapter.id, Kind::Adapter);
  changed.record.Set("discoveryStatus", int{outcome});
  tree.Update(changed);
}

}  // namespace host

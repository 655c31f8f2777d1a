#include "host/Targets.h"

#include <algorithm>
#include <map>
#include <unordered_set>

#include "host/Storage.h"
#include "host/TargetSchema.h"
#include "store/Document.h"

namespace host {

namespace {

/// The portals of the adapter that lead to the target @p name: their names begin with it.
std::vector<Record> PortalsTo(Tree& tree, std::int64_t adapter, const std::string& name) {
  Statement statement(
      tree.GetStore(),
      "SELECT id, record FROM object WHERE parent = ? AND kind = ? AND name > ? AND name < ?");
  const std::string least = name + ' ';
  const std::string most = name + '!';  // what follows a blank
  statement.Bind(adapter).Bind(static_cast<std::int64_t>(Kind::StaticTarget)).Bind(least).Bind(most);
  std::map<std::int64_t, Record> inOrder;
  while (statement.Step()) {
    Record portal = Record::Stored(statement.GetBytes(1));
    if (portal.GetString("name") == name) inOrder.emplace(statement.GetInt(0), std::move(portal));
  }
  std::vector<Record> portals;
  portals.reserve(inOrder.size());
  for (auto& [id, portal] : inOrder) portals.push_back(std::move(portal));
  return portals;
}

Record NewTarget(const std::string& name) {
  Record given;
  given.Set("name", name);
  return Complete(Kind::Target, given);
}

bool IsSamePlace(const Record& a, const Record& b) {
  return a.GetString("address") == b.GetString("address") && a.GetInt("port") == b.GetInt("port");
}

}  // namespace

KnownTarget GetTargetAlone(Tree& tree, std::int64_t id) {
  const Object* const seen = tree.Look(id);
  if (seen == nullptr || seen->kind != Kind::StaticTarget) {
    const Object& own = tree.See(id, Kind::Target);
    return {.adapter = own.parent, .object = own, .portals = {}};
  }
  KnownTarget target{.adapter = seen->parent, .object = {}, .portals = {}};
  const std::string name = seen->record.GetString("name");
  if (std::optional<Object> own = tree.Find(target.adapter, Kind::Target, name)) {
    target.object = *std::move(own);
  } else {
    target.object.record = NewTarget(name);
  }
  return target;
}

KnownTarget GetTarget(Tree& tree, std::int64_t id) {
  KnownTarget target = GetTargetAlone(tree, id);
  target.portals = PortalsTo(tree, target.adapter, target.object.record.GetString("name"));
  return target;
}

std::int64_t OwnIdOf(Tree& tree, std::int64_t id) { return GetTargetAlone(tree, id).object.id; }

std::vector<std::int64_t> TargetIds(Tree& tree, std::int64_t adapter) {
  std::vector<std::int64_t> ids;
  std::unordered_set<std::string> seen;
  {
    Statement own(tree.GetStore(), "SELECT id, name FROM object WHERE parent = ? AND kind = ? ORDER BY id");
    own.Bind(adapter).Bind(static_cast<std::int64_t>(Kind::Target));
    for (; own.Step(); seen.emplace(own.GetText(1))) ids.push_back(own.GetInt(0));
  }
  tree.ForEachChild(adapter, Kind::StaticTarget, [&](std::int64_t id, const Record& portal) {
    if (seen.insert(portal.GetString("name")).second) ids.push_back(id);
  });
  for (const Object& target : tree.OfMachine(adapter, Kind::Target)) {
    if (seen.insert(target.name).second) ids.push_back(target.id);
  }
  return ids;
}

std::vector<Record> AddressesOf(const KnownTarget& target) {
  std::vector<Record> addresses;
  const Record& own = target.object.record;
  for (std::size_t i = 0; i < own.GetSize("addresses"); ++i) {
    addresses.push_back(own.GetRecord("addresses/" + std::to_string(i)));
  }
  for (const Record& portal : target.portals) {
    if (!IpFault(portal.GetString("host")).empty()) continue;
    Record address;
    address.Set("address", portal.GetString("host"));
    address.Set("portAndTagPresent", portal.Has("portalGroup") ? 1 : 0);
    address.Set("port", portal.GetInt("port"));
    address.Set("tag", portal.Has("portalGroup") ? portal.GetInt("portalGroup") : 0);
    const auto same = [&](const Record& other) { return IsSamePlace(other, address); };
    if (std::none_of(addresses.begin(), addresses.end(), same)) addresses.push_back(std::move(address));
  }
  return addresses;
}

bool IsStatic(const Record& portal) {
  return !portal.Has("sendTarget") || (portal.Has("static") && portal.GetBool("static"));
}

std::string OriginOf(const Record& portal) {
  return portal.Has("sendTarget") ? NameOf(Kind::SendTarget, portal.GetRecord("sendTarget")) : std::string();
}

std::string ParentOf(const Record& portal) { return IsStatic(portal) ? std::string() : OriginOf(portal); }

bool HasSession(Tree& tree, const Object& target) { return !tree.ChildIds(target.id, Kind::Session).empty(); }

void ForgetTarget(Tree& tree, const Object& target) {
  if (target.record.GetSize("addresses") != 0) return;
  for (std::size_t i = 0; i < target.record.GetSize("discoveryMethods"); ++i) {
    // A static target is a portal, and leads to its target as long as it is listed.
    if (target.record.GetString("discoveryMethods/" + std::to_string(i)) != "static") return;
  }
  if (HasSession(tree, target) || !PortalsTo(tree, target.parent, target.name).empty()) return;
  tree.Remove(target.id);
}

void SettleTargets(Tree& tree, std::int64_t adapter) {
  for (const std::int64_t id : TargetIds(tree, adapter)) {
    const KnownTarget target = GetTarget(tree, id);
    if (target.object.id == 0) tree.Insert(adapter, Kind::Target, target.object.record);
  }
}

Object& OwnObject(Tree& tree, KnownTarget& target) {
  if (target.object.id != 0) return target.object;
  SettleTargets(tree, target.adapter);
  target.object = *tree.Find(target.adapter, Kind::Target, target.object.record.GetString("name"));
  return target.object;
}

}  // namespace host

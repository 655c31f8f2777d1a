#include "host/Paths.h"

#include <algorithm>
#include <map>
#include <set>

namespace host {

namespace {

enum Path : int { kUnused, kStandby, kActive, kLastPath };

/// All sessions of the adapter.
std::vector<Object> SessionsOf(Tree& tree, const Object& adapter) {
  std::vector<Object> sessions;
  for (const std::int64_t target : tree.ChildIds(adapter.id, Kind::Target)) {
    std::vector<Object> own = tree.Children(target, Kind::Session);
    std::move(own.begin(), own.end(), std::back_inserter(sessions));
  }
  return sessions;
}

bool GoesOver(const Object& session, const std::string& nic) {
  return !session.record.Has("portal") || session.record.GetString("portal") == nic;
}

}  // namespace

std::vector<Object> SessionsOver(Tree& tree, const Object& adapter, const std::string& nic) {
  std::vector<Object> sessions = SessionsOf(tree, adapter);
  std::erase_if(sessions, [&](const Object& session) { return !GoesOver(session, nic); });
  return sessions;
}

bool IsDescribedAsUsed(const Object& portal) {
  if (!portal.record.Has("pathStatus")) return false;
  const int status = portal.record.GetInt("pathStatus");
  return status == kActive || status == kLastPath;
}

std::vector<int> PathStatuses(Tree& tree, const Object& adapter, const std::vector<Object>& portals) {
  std::map<std::int64_t, std::set<std::string>> pathsOf;  // by the target
  for (const Object& session : SessionsOf(tree, adapter)) {
    std::set<std::string>& paths = pathsOf[session.parent];
    for (const Object& portal : portals) {
      if (GoesOver(session, portal.name)) paths.insert(portal.name);
    }
  }
  std::vector<int> statuses;
  for (const Object& portal : portals) {
    if (portal.record.Has("pathStatus")) {
      statuses.push_back(portal.record.GetInt("pathStatus"));
      continue;
    }
    int status = pathsOf.empty() ? kUnused : kStandby;
    for (const auto& [target, paths] : pathsOf) {
      if (paths.contains(portal.name))
        status = std::max<int>(status, paths.size() == 1 ? kLastPath : kActive);
    }
    statuses.push_back(status);
  }
  return statuses;
}

}  // namespace host

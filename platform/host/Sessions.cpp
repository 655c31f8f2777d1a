#include "host/Sessions.h"

#include "host/Initiator.h"
#include "host/LoginStatus.h"

namespace host {

namespace {

Initiator InitiatorOf(Tree& tree, const KnownTarget& target) {
  return {tree, tree.Get(target.adapter, Kind::Adapter)};
}

void LogoutFrom(Tree& tree, const Object& adapter, const Object& target,
                const std::vector<Object>& sessions) {
  for (const Object& session : sessions) {
    tree.GetNetwork().Logout({.initiator = adapter.record.GetString("initiatorName"),
                              .target = target.name,
                              .isid = session.record.GetString("isid"),
                              .tsih = session.record.GetInt("tsih"),
                              .session = session.id});
    tree.Remove(session.id);
  }
  if (!sessions.empty()) ForgetTarget(tree, target);
}

}  // namespace

std::optional<Error> Login(Tree& tree, KnownTarget& target) {
  FailedLogins failed;
  failed.Note(target, InitiatorOf(tree, target).LoginOnceMore(target));
  return failed.GetError();
}

std::optional<Error> LoginLike(Tree& tree, KnownTarget& target, const Object& session) {
  FailedLogins failed;
  failed.Note(target, InitiatorOf(tree, target).LoginBeside(target, session));
  return failed.GetError();
}

std::optional<Error> LoginAdapter(Tree& tree, const Object& adapter) {
  Initiator initiator(tree, adapter);
  FailedLogins failed;
  for (const std::int64_t id : TargetIds(tree, adapter.id)) {
    KnownTarget target = GetTarget(tree, id);
    failed.Note(target, initiator.LoginWhereMissing(target));
  }
  return failed.GetError();
}

void LogoutSession(Tree& tree, const Object& session) {
  const Object target = tree.Get(session.parent, Kind::Target);
  LogoutFrom(tree, tree.Get(target.parent, Kind::Adapter), target, {session});
}

void Logout(Tree& tree, const KnownTarget& target) {
  if (target.object.id == 0) return;
  LogoutFrom(tree, tree.Get(target.adapter, Kind::Adapter), target.object,
             tree.Children(target.object.id, Kind::Session));
}

void LogoutAdapter(Tree& tree, const Object& adapter) {
  for (const Object& target : tree.Children(adapter.id, Kind::Target)) {
    LogoutFrom(tree, adapter, target, tree.Children(target.id, Kind::Session));
  }
}

}  // namespace host

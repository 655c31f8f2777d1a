#include "ima/Objects.h"

#include "host/Adapters.h"

namespace ima {

namespace {

host::Kind KindOf(IMA_OBJECT_TYPE type) {
  switch (type) {
    case IMA_OBJECT_TYPE_PLUGIN:
      return host::Kind::Plugin;
    case IMA_OBJECT_TYPE_STATIC_DISC_TARGET:
      return host::Kind::StaticTarget;
    case IMA_OBJECT_TYPE_SESSION:
      return host::Kind::Session;
    case IMA_OBJECT_TYPE_CONNECTION:
      return host::Kind::Connection;
    case kRouteType:
      return host::Kind::Route;
    default:
      return host::Kind::Adapter;  // logical and physical
  }
}

}  // namespace

host::Object Get(host::Tree& tree, const IMA_OID& oid, IMA_OBJECT_TYPE type) { return See(tree, oid, type); }

const host::Object& See(host::Tree& tree, const IMA_OID& oid, IMA_OBJECT_TYPE type) {
  const host::Object& object = tree.See(IdOfType(oid, type), KindOf(type));
  if (type == IMA_OBJECT_TYPE_LHBA && !host::IsPresent(tree, object)) {
    throw host::Error(host::Error::Kind::NotFound, "The adapter is gone.");
  }
  return object;
}

host::KnownTarget GetTarget(host::Tree& tree, const IMA_OID& oid) {
  return host::GetTarget(tree, IdOfType(oid, IMA_OBJECT_TYPE_TARGET));
}

IMA_STATUS ListChildren(host::Operation operation, const IMA_OID& oid, IMA_OBJECT_TYPE type, host::Kind kind,
                        IMA_OBJECT_TYPE childType, IMA_OID_LIST** list) noexcept {
  return ReadObject(operation, oid, [&](host::Tree& tree) {
    *list = OidList(childType, tree.ChildIds(Get(tree, oid, type).id, kind)).release();
  });
}

}  // namespace ima

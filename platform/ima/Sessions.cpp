/// Sessions and connections, and logging in and out.
#include "host/Sessions.h"

#include <ima/ima_tsr.h>

#include <charconv>

#include "ima/Objects.h"

using host::Kind;
using host::Object;
using host::Record;
using host::Tree;

namespace {

void SetIsid(IMA_INITIATOR_SESSION_ID& isid, const std::string& text) {
  bool isRight = text.size() == 2 * sizeof isid;
  for (std::size_t i = 0; isRight && i < sizeof isid; ++i) {
    const char* const digits = text.data() + 2 * i;
    isRight = std::from_chars(digits, digits + 2, isid[i], 16).ptr == digits + 2;
  }
  if (!isRight) {
    throw host::Error(host::Error::Kind::Damaged, "the ISID of a session is not twelve hexadecimal digits");
  }
}

/// Sets what the record tells, and that it tells it.
void SetAddress(const Record& record, const char* key, IMA_UINT32& present, IMA_IP_ADDRESS& address) {
  if (!record.Has(key)) return;
  present = 1;
  address = ima::Address(record.GetString(key));
}
void SetTime(const Record& record, const char* key, IMA_UINT32& present, IMA_DATETIME& time) {
  if (!record.Has(key)) return;
  present = 1;
  time = ima::Time(record.GetString(key));
}

/// The login that the object stands for; an Error when a target refuses.
std::optional<host::Error> LoginTo(Tree& tree, const IMA_OID& oid) {
  switch (oid.objectType) {
    case IMA_OBJECT_TYPE_SESSION: {
      const Object session = ima::Get(tree, oid, IMA_OBJECT_TYPE_SESSION);
      host::KnownTarget target = host::GetTarget(tree, session.parent);
      return host::LoginLike(tree, target, session);
    }
    case IMA_OBJECT_TYPE_TARGET: {
      host::KnownTarget target = ima::GetTarget(tree, oid);
      return host::Login(tree, target);
    }
    default:
      return host::LoginAdapter(tree, ima::Get(tree, oid, IMA_OBJECT_TYPE_LHBA));
  }
}

}  // namespace

extern "C" IMA_STATUS IMA_GetSessionOidList(IMA_OID targetOid, IMA_OID_LIST** list) {
  return ima::ReadObject("IMA_GetSessionOidList", targetOid, [&](Tree& tree) {
    // Without an object of its own it has no sessions, and 0 is nothing's parent but the host's.
    const std::int64_t target = host::OwnIdOf(tree, ima::IdOfType(targetOid, IMA_OBJECT_TYPE_TARGET));
    *list = ima::OidList(IMA_OBJECT_TYPE_SESSION, tree.ChildIds(target, Kind::Session)).release();
  });
}

extern "C" IMA_STATUS IMA_GetSessionProperties(IMA_OID sessionOid, IMA_SESSION_PROPERTIES* properties) {
  return ima::ReadProperties("IMA_GetSessionProperties", sessionOid, IMA_OBJECT_TYPE_SESSION, properties,
                             [](Tree&, const Object& session, IMA_SESSION_PROPERTIES& filled) {
                               const Record& record = session.record;
                               // In the order in which they are stored, which is the fastest.
                               filled.associatedTargetOid = ima::Oid(IMA_OBJECT_TYPE_TARGET, session.parent);
                               SetIsid(filled.isid, record.GetString("isid"));
                               filled.tsih = ima::Unsigned16(record, "tsih");
                               filled.targetPortalGroupTag = ima::Unsigned16(record, "targetPortalGroupTag");
                               filled.authMethod = ima::Unsigned(record, "authMethod");
                               filled.dataPduInOrder = ima::Bool(record, "dataPduInOrder");
                               filled.dataSequenceInOrder = ima::Bool(record, "dataSequenceInOrder");
                               filled.defaultTime2Retain = ima::Unsigned(record, "defaultTime2Retain");
                               filled.defaultTime2Wait = ima::Unsigned(record, "defaultTime2Wait");
                               filled.errorRecoveryLevel = ima::Unsigned(record, "errorRecoveryLevel");
                               filled.firstBurstLength = ima::Unsigned(record, "firstBurstLength");
                               filled.immediateData = ima::Bool(record, "immediateData");
                               filled.initialR2T = ima::Bool(record, "initialR2T");
                               filled.maxBurstLength = ima::Unsigned(record, "maxBurstLength");
                               filled.maxConnections = ima::Unsigned(record, "maxConnections");
                               filled.maxOutstandingR2T = ima::Unsigned(record, "maxOutstandingR2T");
                             });
}

extern "C" IMA_STATUS IMA_GetConnectionOidList(IMA_OID sessionOid, IMA_OID_LIST** list) {
  return ima::ListChildren("IMA_GetConnectionOidList", sessionOid, IMA_OBJECT_TYPE_SESSION, Kind::Connection,
                           IMA_OBJECT_TYPE_CONNECTION, list);
}

extern "C" IMA_STATUS IMA_GetConnectionProperties(IMA_OID connectionOid,
                                                  IMA_CONNECTION_PROPERTIES* properties) {
  return ima::ReadProperties(
      "IMA_GetConnectionProperties", connectionOid, IMA_OBJECT_TYPE_CONNECTION, properties,
      [](Tree&, const Object& connection, IMA_CONNECTION_PROPERTIES& filled) {
        const Record& record = connection.record;
        filled.associatedSessionOid = ima::Oid(IMA_OBJECT_TYPE_SESSION, connection.parent);
        filled.connectionId = ima::Unsigned16(record, "cid");
        filled.dataDigest = ima::Unsigned(record, "dataDigest");
        filled.headerDigest = ima::Unsigned(record, "headerDigest");
        filled.ifMarker = ima::Bool(record, "ifMarker");
        filled.ifMarkerInterval = ima::Unsigned(record, "ifMarkerInterval");
        filled.maxRecvDataSegmentLength = ima::Unsigned(record, "maxRecvDataSegmentLength");
        filled.maxTransmitDataSegmentLength = ima::Unsigned(record, "maxTransmitDataSegmentLength");
        filled.ofMarker = ima::Bool(record, "ofMarker");
        filled.ofMarkerInterval = ima::Unsigned(record, "ofMarkerInterval");
      });
}

extern "C" IMA_STATUS IMA_TSR_GetConnectionStatus(IMA_OID connectionOid, IMA_TSR_CONNECTION_STATUS* status) {
  return ima::ReadProperties(
      "IMA_TSR_GetConnectionStatus", connectionOid, IMA_OBJECT_TYPE_CONNECTION, status,
      [](Tree&, const Object& connection, IMA_TSR_CONNECTION_STATUS& filled) {
        const Record& record = connection.record;
        SetAddress(record, "connectionAddress", filled.connectionAddressPresent, filled.connectionAddress);
        SetAddress(record, "remoteAddress", filled.remoteAddressPresent, filled.remoteAddress);
        SetAddress(record, "localAddress", filled.localAddressPresent, filled.localAddress);
        filled.state = ima::Unsigned(record, "state");
        SetTime(record, "connectionCreateTime", filled.connectionCreateTimePresent,
                filled.connectionCreateTime);
        SetTime(record, "connectionStartTime", filled.connectionStartTimePresent, filled.connectionStartTime);
        SetTime(record, "sessionCreateTime", filled.sessionCreateTimePresent, filled.sessionCreateTime);
      });
}

extern "C" IMA_STATUS IMA_TSR_AddSession(IMA_OID oid, IMA_UINT reserved1, IMA_UINT reserved2,
                                         IMA_UINT reserved3) {
  const auto call = host::Call::Ima("IMA_TSR_AddSession", ima::Id(oid),
                                    {ima::OidArgument(oid), reserved1, reserved2, reserved3});
  // A refused login is kept: the target's status word tells of it.
  return ima::Change(call, [&](Tree& tree) { return LoginTo(tree, oid); });
}

extern "C" IMA_STATUS IMA_TSR_RemoveSession(IMA_OID oid) {
  const auto call = host::Call::Ima("IMA_TSR_RemoveSession", ima::Id(oid), {ima::OidArgument(oid)});
  return ima::Change(call, [&](Tree& tree) {
    switch (oid.objectType) {
      case IMA_OBJECT_TYPE_SESSION:
        return host::LogoutSession(tree, ima::Get(tree, oid, IMA_OBJECT_TYPE_SESSION));
      case IMA_OBJECT_TYPE_TARGET:
        return host::Logout(tree, ima::GetTarget(tree, oid));
      default:
        return host::LogoutAdapter(tree, ima::Get(tree, oid, IMA_OBJECT_TYPE_LHBA));
    }
  });
}

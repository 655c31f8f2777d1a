#include "linux/Machine.h"

#include <algorithm>
#include <cstdio>

#include "host/Formats.h"
#include "host/Schema.h"
#include "linux/Interfaces.h"
#include "linux/Joined.h"
#include "store/Document.h"

namespace linux {

namespace {

using store::Kind;
using store::Object;
using store::Record;

// Ids of the machine's objects, by the kernel's numbers.
constexpr std::int64_t kNics = host::kFirstMachineId;
constexpr std::int64_t kTargets = kNics + (std::int64_t{1} << 32);
constexpr std::int64_t kSessions = kTargets + (std::int64_t{1} << 32);
constexpr std::int64_t kConnections = kSessions + (std::int64_t{1} << 32);

constexpr std::string_view kOurs = "hcli.";

// States of a connection, as the management API counts.
constexpr int kFree = 0;
constexpr int kLoggedIn = 4;
constexpr int kCleanupWait = 7;

void SetAddress(Record& record, const char* key, const std::string& address) {
  if (host::ParseIpv4(address) || host::ParseIpv6(address)) record.Set(key, address);
}

Record SessionRecord(const Session& session, const std::string& prefix) {
  Record record;
  // open-iscsi gives its sessions ISIDs of its own, which end with the number of the session.
  char isid[13];
  std::snprintf(isid, sizeof isid, "00023d%06x", static_cast<unsigned>(session.number) & 0xffffffu);
  record.Set("isid", isid);
  if (session.interface.starts_with(prefix + "."))
    record.Set("portal", session.interface.substr(prefix.size() + 1));
  record.Set("tsih", session.number & 0xffff);
  record.Set("targetPortalGroupTag", session.portalGroup & 0xffff);
  record.Set("authMethod", session.user.empty() ? 0 : 1);
  record.Set("dataPduInOrder", session.dataPduInOrder);
  record.Set("dataSequenceInOrder", session.dataSequenceInOrder);
  record.Set("errorRecoveryLevel", session.errorRecoveryLevel);
  record.Set("firstBurstLength", session.firstBurst);
  record.Set("immediateData", session.immediateData);
  record.Set("initialR2T", session.initialR2T);
  record.Set("maxBurstLength", session.maxBurst);
  record.Set("maxOutstandingR2T", session.maxOutstandingR2T);
  return record;
}

Record ConnectionRecord(const Session& session, const Connection& connection) {
  Record record;
  record.Set("cid", connection.number & 0xffff);
  record.Set("dataDigest", connection.dataDigest ? 1 : 0);
  record.Set("headerDigest", connection.headerDigest ? 1 : 0);
  record.Set("maxRecvDataSegmentLength", connection.maxReceive);
  record.Set("maxTransmitDataSegmentLength", connection.maxTransmit);
  SetAddress(record, "connectionAddress", connection.persistentAddress);
  SetAddress(record, "remoteAddress", connection.address);
  SetAddress(record, "localAddress", session.localAddress);
  const bool isUp = session.state == "LOGGED_IN" && connection.state == "up";
  record.Set("state", isUp ? kLoggedIn : connection.state == "failed" ? kCleanupWait : kFree);
  return record;
}

std::string NetmaskOf(int prefixLength) {
  host::Ipv4Bytes mask{};
  for (int bit = 0; bit < prefixLength; ++bit)
    mask[static_cast<std::size_t>(bit / 8)] |= static_cast<std::uint8_t>(0x80 >> bit % 8);
  return host::FormatIpv4(mask);
}

Record AddressRecord(const InterfaceAddress& own) {
  Record address;
  address.Set("address", own.address);
  address.Set("prefixLength", own.prefixLength);
  address.Set("type", 0);  // the kernel does not tell an interface's own business
  return address;
}

Record NicRecord(const NetworkInterface& interface) {
  Record record;
  record.Set("name", interface.name);
  record.Set("deviceName", interface.name);
  record.Set("mac", interface.mac);
  if (!interface.ipv4.empty()) {
    record.Set("ipv4Address", interface.ipv4.front().address);
    record.Set("ipv4Netmask", NetmaskOf(interface.ipv4.front().prefixLength));
  }
  record.Set("mtu", interface.mtu);
  record.Set("linkUp", interface.isUp && interface.hasLink);
  record.Set("currentSpeed", interface.speed);
  return record;
}

Object ObjectOf(std::int64_t id, std::int64_t parent, Kind kind, const Record& given) {
  Record record = store::Complete(kind, given);
  std::string name = store::NameOf(kind, record);
  return {id, parent, kind, std::move(name), std::move(record)};
}

}  // namespace

std::string InterfaceName(const std::string& adapter, const std::string& nic) {
  return Joined({kOurs, adapter, nic.empty() ? "" : ".", nic});
}

bool IsOurs(const std::string& interface) { return interface.starts_with(kOurs); }

std::int64_t IdOfSession(int number) { return kSessions + number; }
int NumberOfSession(std::int64_t id) { return static_cast<int>(id - kSessions); }

std::vector<Object> Machine::Children(std::int64_t parent, Kind kind) {
  Look();
  std::vector<Object> children;
  std::ranges::copy_if(objects_, std::back_inserter(children),
                       [&](const Object& object) { return object.parent == parent && object.kind == kind; });
  return children;
}

std::optional<Object> Machine::Lookup(std::int64_t id) {
  Look();
  const auto found = std::ranges::find(objects_, id, &Object::id);
  if (found == objects_.end()) return {};
  return *found;
}

void Machine::Look() {
  if (hasLooked_) return;
  hasLooked_ = true;
  AddNics();
  const std::vector<Session> sessions = ReadSessions();
  bool isFirst = true;
  for (const Object& adapter : tree_.store::Tree::Children(store::kRoot, Kind::Adapter)) {
    const std::string own = InterfaceName(adapter.name, "");
    for (const Session& session : sessions) {
      if (session.interface == own || session.interface.starts_with(own + ".") ||
          (isFirst && !IsOurs(session.interface)))
        AddSession(adapter, session);
    }
    isFirst = false;
  }
}

void Machine::AddNics() {
  std::int64_t id = kNics;
  for (const NetworkInterface& interface : ReadInterfaces()) {
    ++id;  // by their names: one that comes or goes changes the ids of later processes alone
    if (interface.isLoopback) continue;
    Object& nic = objects_.emplace_back(ObjectOf(id, store::kRoot, Kind::Nic, NicRecord(interface)));
    for (const InterfaceAddress& own : interface.ipv6) nic.record.Append("ipv6Addresses", AddressRecord(own));
  }
}

/// The id of the session's target, of the store or else of the machine.
std::int64_t Machine::TargetOf(const Object& adapter, const Session& session) {
  if (const auto known = tree_.store::Tree::Find(adapter.id, Kind::Target, session.target)) return known->id;
  for (const Object& object : objects_) {
    if (object.kind == Kind::Target && object.parent == adapter.id && object.name == session.target)
      return object.id;
  }
  Record target;
  target.Set("name", session.target);
  objects_.push_back(ObjectOf(kTargets + session.number, adapter.id, Kind::Target, target));
  return objects_.back().id;
}

void Machine::AddSession(const Object& adapter, const Session& session) {
  const std::int64_t id = IdOfSession(session.number);
  const std::int64_t target = TargetOf(adapter, session);
  objects_.push_back(
      ObjectOf(id, target, Kind::Session, SessionRecord(session, InterfaceName(adapter.name, ""))));
  for (const Connection& connection : session.connections) {
    const std::int64_t own = kConnections + session.number * std::int64_t{65536} + connection.number;
    objects_.push_back(ObjectOf(own, id, Kind::Connection, ConnectionRecord(session, connection)));
  }
}

}  // namespace linux

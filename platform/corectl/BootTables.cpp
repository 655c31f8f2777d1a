// The boot tables of the host's firmware, and the import of the boot target.

#include <CoreCtl/Storage.h>

#include <charconv>
#include <variant>

#include "corectl/Level.h"
#include "host/Formats.h"
#include "host/LevelSchema.h"
#include "host/NetworkSchema.h"
#include "host/Sessions.h"

namespace corectl {

namespace {

using host::Kind;
using NodeCtl::Storage::iScsiBootTable;

struct TableMember {
  const char* key;
  std::variant<void (iScsiBootTable::*)(int), void (iScsiBootTable::*)(std::string)> set;
};

constexpr TableMember kTableMembers[] = {
    {"enabled", &iScsiBootTable::SetEnabled},
    {"nicFlags", &iScsiBootTable::SetNicFlags},
    {"nicPciBusDevFunc", &iScsiBootTable::SetNicPciBusDevFunc},
    {"macAddress", &iScsiBootTable::SetMacAddress},
    {"nicIP", &iScsiBootTable::SetNicIP},
    {"nicSubnetMask", &iScsiBootTable::SetNicSubnetMask},
    {"nicGateway", &iScsiBootTable::SetNicGateway},
    {"nicDhcp", &iScsiBootTable::SetNicDhcp},
    {"nicVlan", &iScsiBootTable::SetNicVlan},
    {"targetBootFlags", &iScsiBootTable::SetTargetBootFlags},
    {"targetIP", &iScsiBootTable::SetTargetIP},
    {"targetPort", &iScsiBootTable::SetTargetPort},
    {"targetName", &iScsiBootTable::SetTargetName},
    {"chapType", &iScsiBootTable::SetChapType},
    {"chapName", &iScsiBootTable::SetChapName},
    {"chapPwd", &iScsiBootTable::SetChapPwd},
    {"reverseChapName", &iScsiBootTable::SetReverseChapName},
    {"reverseChapPwd", &iScsiBootTable::SetReverseChapPwd},
    {"initiatorBootFlags", &iScsiBootTable::SetInitiatorBootFlags},
    {"slpIP", &iScsiBootTable::SetSlpIP},
    {"initiatorName", &iScsiBootTable::SetInitiatorName},
    {"initiatorAlias", &iScsiBootTable::SetInitiatorAlias},
};

/// The boot table @p name; all zeros and empty texts where the host does not have it.
iScsiBootTable ReadTable(host::Tree& tree, std::string_view name) {
  iScsiBootTable table;
  const auto found = tree.Find(host::kRoot, Kind::BootTable, name);
  if (!found) return table;
  for (const TableMember& member : kTableMembers) {
    std::visit(
        [&](auto set) {
          if constexpr (std::is_same_v<decltype(set), void (iScsiBootTable::*)(int)>) {
            (table.*set)(found->record.GetInt(member.key));
          } else {
            (table.*set)(found->record.GetString(member.key));
          }
        },
        member.set);
  }
  const std::string& lun = found->record.GetString("lun");
  std::uint64_t number = 0;
  std::from_chars(lun.data(), lun.data() + lun.size(), number);
  table.SetLun(number);
  return table;
}

/// What the primary table tells of the boot target, and of how to reach it.
struct Boot {
  iScsiBootTable table;
  StaticTarget target;
};

/// The number of CHAP types of boot tables: 0 none, 1 CHAP, 2 mutual CHAP.
constexpr int kChapTypes = 3;

Boot ReadBoot(host::Tree& tree) {
  Boot boot{.table = ReadTable(tree, host::kBootTableNames[0]), .target = {}};
  const iScsiBootTable& table = boot.table;
  if (table.GetEnabled() == 0) Deny(Why::NotFound, "The host has no primary boot table that is enabled.");
  RequireInitiatorName(table.GetTargetName());
  const Network::HostAddress server(table.GetTargetIP());
  if (server.GetFamily() == Network::AddressFamily::Name) {
    Deny(Why::Invalid,
         "The boot table's target address " + host::Quoted(table.GetTargetIP()) + " is not an IP address.");
  }
  if (table.GetChapType() < 0 || table.GetChapType() >= kChapTypes) {
    Deny(Why::Invalid, "The boot table's CHAP type " + std::to_string(table.GetChapType()) +
                           " is not from 0 to " + std::to_string(kChapTypes - 1) + ".");
  }
  if (table.GetChapType() > 0) {
    RequireChapEntry(table.GetChapName(), table.GetChapPwd(), "The boot table's CHAP");
  }
  if (table.GetChapType() > 1) {
    RequireChapEntry(table.GetReverseChapName(), table.GetReverseChapPwd(), "The boot table's mutual CHAP");
  }
  boot.target = {table.GetTargetName(), {server, static_cast<std::uint16_t>(table.GetTargetPort())}};
  return boot;
}

/// Whether the MAC address is that of a physical port of the adapter, or of a NIC that is bound to it.
bool HasMac(host::Tree& tree, const host::Object& adapter, const std::string& mac) {
  const auto wanted = host::ParseMac(mac);
  const auto fits = [&](const host::Object& port) {
    return wanted && host::ParseMac(port.record.GetString("mac")) == wanted;
  };
  for (const host::Object& port : tree.Children(adapter.id, Kind::PhysicalPortal)) {
    if (fits(port)) return true;
  }
  for (const host::Object& portal : tree.Children(adapter.id, Kind::NetworkPortal)) {
    const auto nic = tree.Find(host::kRoot, Kind::Nic, portal.name);
    if (nic && fits(*nic)) return true;
  }
  return false;
}

/// Whether the adapter can be given the boot target: it shares the host's network, works, takes targets of
/// that kind, and has the NIC that the firmware booted over where the table tells which that is.
bool IsEligible(host::Tree& tree, const host::Object& adapter, const Boot& boot) {
  const auto has = [&](const char* capability) {
    return adapter.record.GetBool(std::string("capabilities/") + capability);
  };
  const int chap = boot.table.GetChapType();
  const bool isIpv6 = boot.target.address.host.GetFamily() == Network::AddressFamily::Ipv6;
  const std::string mac = boot.table.GetMacAddress();
  return adapter.record.GetString("kind") == "dependent" && adapter.record.GetInt("state") == 0 &&
         has("Static Discovery Settable") && (!isIpv6 || has("IPv6 Supported")) &&
         (chap < 1 || has("Target Level Authentication Supported")) &&
         (chap < 2 || has("Target Level Mutual Authentication Supported")) &&
         (mac.empty() || HasMac(tree, adapter, mac));
}

/// The static target of the adapter, marked as the only one that the host boots from, with the CHAP of the
/// table in place of any other.
std::int64_t AddBootTarget(host::Tree& tree, const host::Object& adapter, const Boot& boot) {
  auto place = LookupPlace(tree, adapter, boot.target);
  if (!place) place = tree.InsertNew(adapter.id, Kind::StaticTarget, PlaceRecord(boot.target));
  for (host::Object& other : tree.Children(adapter.id, Kind::StaticTarget)) {
    if (other.id == place->id || !other.record.GetBool("boot")) continue;
    other.record.Set("boot", false);
    tree.Update(other);
  }
  const int chap = boot.table.GetChapType();
  const std::pair<std::string, std::string> entries[] = {
      {boot.table.GetChapName(), boot.table.GetChapPwd()},
      {boot.table.GetReverseChapName(), boot.table.GetReverseChapPwd()}};
  place->record.Set("boot", true);
  if (place->record.Has("sendTarget")) place->record.Set("static", true);
  host::Record own;
  for (int direction = 0; direction < chap; ++direction) {
    host::Record entry;
    entry.Set("inherited", false);
    entry.Set("name", entries[direction].first);
    entry.Set("secret", entries[direction].second);
    entry.Set("level", host::kDemands[3]);  // the table leaves no choice
    own.Set(host::kDirections[direction], entry);
  }
  place->record.Set("chap", own);
  tree.Update(*place);
  return place->id;
}

/// A target that refuses the login tells so by its status word.
void LoginOnce(host::Tree& tree, std::int64_t id) {
  host::KnownTarget target = host::GetTarget(tree, id);
  if (target.object.id != 0 && !tree.ChildIds(target.object.id, Kind::Session).empty()) return;
  host::Login(tree, target);
}

}  // namespace

}  // namespace corectl

namespace CoreCtl::Storage {

NodeCtl::Storage::iScsiBootTables StorageInfoImpl::GetiScsiBootTables() {
  return corectl::Read(host::Call::OnHost("GetiScsiBootTables"), [](host::Tree& tree) {
    NodeCtl::Storage::iScsiBootTables tables;
    tables.SetPrimary(corectl::ReadTable(tree, host::kBootTableNames[0]));
    tables.SetSecondary(corectl::ReadTable(tree, host::kBootTableNames[1]));
    return tables;
  });
}

void StorageInfoImpl::MountiScsiBootLun(bool addTarget, bool login) {
  corectl::Change(host::Call::OnHost("MountiScsiBootLun", {addTarget, login}), [&](host::Tree& tree) {
    const corectl::Boot boot = corectl::ReadBoot(tree);
    std::vector<host::Object> adapters = host::IscsiAdapters(tree);
    std::erase_if(adapters,
                  [&](const host::Object& adapter) { return !corectl::IsEligible(tree, adapter, boot); });
    if (adapters.empty()) {
      corectl::Deny(
          corectl::Why::NotFound,
          "No dependent adapter that is online can take the boot target " + corectl::PlaceText(boot.target) +
              (boot.table.GetMacAddress().empty() ? "." : " of the NIC " + boot.table.GetMacAddress() + "."));
    }
    for (const host::Object& adapter : adapters) {
      if (!addTarget) continue;
      const std::int64_t id = corectl::AddBootTarget(tree, adapter, boot);
      if (login) corectl::LoginOnce(tree, id);
    }
  });
}

}  // namespace CoreCtl::Storage

#include "host/Storage.h"

#include <CoreCtl/Storage.h>
#include <sys/stat.h>

#include <cstdio>
#include <optional>
#include <utility>

#include "corectl/Adapter.h"
#include "host/Formats.h"
#include "host/InitiatorNameFile.h"
#include "host/Restart.h"

namespace NodeCtl::Storage {

ScsiInterface::~ScsiInterface() = default;
iScsiInterface::~iScsiInterface() = default;
iScsiBootTable::~iScsiBootTable() = default;

}  // namespace NodeCtl::Storage

namespace corectl {

namespace {

host::Object Root(host::Tree& tree) { return tree.Get(host::kRoot, host::Kind::Host); }

std::vector<host::Object> Adapters(host::Tree& tree) {
  return tree.Children(host::kRoot, host::Kind::Adapter);
}

/// Adds the adapter that the software initiator is, under the first free name.
host::Object InsertSoftwareAdapter(host::Tree& tree) {
  int number = 0;
  std::string name;
  do {
    name = "hba" + std::to_string(number++);
  } while (tree.Find(host::kRoot, host::Kind::Adapter, name));
  host::Record record;
  record.Set("name", name);
  record.Set("kind", "software");
  record.Set("driver", "tsriscsi_sw");
  record.Set("properties/description", "Tessaro Software iSCSI Initiator");
  for (const char* capability :
       {"Static Discovery Settable", "Sendtarget Discovery Settable", "CHAP Authorization Supported",
        "Inheritance Supported", "Name And Alias Settable"}) {
    record.Set(std::string("capabilities/") + capability, true);
  }
  return tree.InsertNew(host::kRoot, host::Kind::Adapter, record);
}

/// Gives the software initiator its configured name, at once where it starts now, which it then does. A name
/// that was given to the adapter itself after the file was written stays. Gives the adapters whose name
/// waits.
std::vector<std::string> NameSoftware(host::Tree& tree, bool starts) {
  const std::optional<std::string> name = host::ConfiguredInitiatorName();
  const bool isUsable = name && host::IscsiNameFault(*name).empty();
  std::vector<host::Object> adapters = Adapters(tree);
  std::erase_if(adapters,
                [](const host::Object& adapter) { return adapter.record.GetString("kind") != "software"; });
  if (adapters.empty() && starts) adapters.push_back(InsertSoftwareAdapter(tree));
  std::vector<std::string> waiting;
  for (host::Object& adapter : adapters) {
    if (isUsable && HeedNameFile(adapter)) {
      const Status status =
          ConfigureName(tree, adapter, *name, starts ? host::Effect::Now : host::Effect::Reboot);
      if (status == Status::RebootRequired) waiting.push_back(adapter.name);
    }
    if (starts) host::Start(tree, tree.Get(adapter.id, host::Kind::Adapter));
  }
  return waiting;
}

}  // namespace

void RequireInitiatorName(const std::string& name) {
  const std::string fault = host::IscsiNameFault(name);
  if (fault.empty()) return;
  throw host::Error(host::Error::Kind::Invalid,
                    host::Quoted(name) + " is not a valid iSCSI name: " + fault + ".");
}

bool HeedNameFile(host::Object& adapter) {
  struct stat file;
  if (!host::IsRegularFile("The file", host::InitiatorNameFile(), file)) return false;
  // Each writing makes a new file.
  const std::string writing = std::to_string(file.st_ino) + ' ' + std::to_string(file.st_mtim.tv_sec) + '.' +
                              std::to_string(file.st_mtim.tv_nsec);
  if (adapter.record.Has("nameFile") && adapter.record.GetString("nameFile") == writing) return false;
  adapter.record.Set("nameFile", writing);
  return true;
}

Status ConfigureName(host::Tree& tree, const host::Object& adapter, const std::string& name,
                     host::Effect effect) {
  host::Object configured = host::Configured(adapter);
  configured.record.Set("initiatorName", name);
  return host::StoreConfigured(tree, adapter, configured.record, effect);
}

}  // namespace corectl

namespace CoreCtl::Storage {

using corectl::Change;
using corectl::Read;
using host::Call;

iScsiInterfaceImpl::~iScsiInterfaceImpl() = default;

StorageInfoImpl::StorageInfoImpl() = default;
StorageInfoImpl::~StorageInfoImpl() = default;

NodeCtl::Storage::ScsiInterface* StorageInfoImpl::GetScsiInterface(const std::string& name) {
  using Owned = std::unique_ptr<NodeCtl::Storage::ScsiInterface>;
  return Read(Call::Lookup("GetScsiInterface", name),
              [&](host::Tree& tree) -> Owned {
                const auto adapter = tree.Find(host::kRoot, host::Kind::Adapter, name);
                if (!adapter || !corectl::IsPresent(tree, *adapter)) return nullptr;
                if (!corectl::IsIscsi(*adapter)) return std::make_unique<corectl::OtherAdapter>(name);
                return std::make_unique<corectl::Adapter>(name);
              })
      .release();
}

std::vector<NodeCtl::Storage::iScsiInterface*> StorageInfoImpl::GetiScsiInterfaces() {
  auto interfaces = Read(Call::OnHost("GetiScsiInterfaces"), [](host::Tree& tree) {
    std::vector<std::unique_ptr<NodeCtl::Storage::iScsiInterface>> owned;
    for (const host::Object& adapter : host::IscsiAdapters(tree)) {
      owned.push_back(std::make_unique<corectl::Adapter>(adapter.name));
    }
    return owned;
  });
  return corectl::HandOut(std::move(interfaces));
}

bool StorageInfoImpl::HasSoftwareiScsiEnabled() {
  return Read(Call::OnHost("HasSoftwareiScsiEnabled"),
              [](host::Tree& tree) { return corectl::Root(tree).record.GetBool("softwareIscsi/enabled"); });
}

void StorageInfoImpl::EnableSoftwareiScsi(bool probe) {
  std::vector<std::string> waiting;
  Change(Call::OnHost("EnableSoftwareiScsi", {probe}), [&](host::Tree& tree) {
    host::Object root = corectl::Root(tree);
    const bool works = host::DoesSoftwareWork(root.record);
    root.record.Set("softwareIscsi/enabled", true);
    root.record.Set("softwareIscsi/rebootPending", false);
    tree.Update(root);
    waiting = corectl::NameSoftware(tree, !works);
  });
  for (const std::string& adapter : waiting) host::CallLog::Current().Waits(adapter, host::Effect::Reboot);
}

void StorageInfoImpl::DisableSoftwareiScsi() {
  bool waits = false;
  Change(Call::OnHost("DisableSoftwareiScsi"), [&](host::Tree& tree) {
    host::Object root = corectl::Root(tree);
    if (!root.record.GetBool("softwareIscsi/enabled")) return;
    root.record.Set("softwareIscsi/enabled", false);
    root.record.Set("softwareIscsi/rebootPending", true);
    tree.Update(root);
    waits = true;
  });
  if (waits) host::CallLog::Current().Waits("the software initiator", host::Effect::Reboot);
}

bool iScsiUtil::CheckInitiatorName(const std::string& name) {
  return corectl::Outside(Call::OnHost("CheckInitiatorName", {name}), [&] {
    corectl::RequireInitiatorName(name);
    return true;
  });
}

NodeCtl::Network::HostAddress iScsiUtil::ConvertHostAddress(const IMA_HOST_ID& hostId) {
  std::optional<std::string> text;
  if (hostId.hostnameInUse != IMA_FALSE) {
    const wchar_t* name = hostId.id.hostname;
    text = host::Utf8FromWide({name, wcsnlen(name, std::size(hostId.id.hostname))});
  } else {
    const auto& bytes = hostId.id.ipAddress.ipAddress;
    if (hostId.id.ipAddress.ipv4Address != IMA_FALSE) {
      text = host::FormatIpv4({bytes[0], bytes[1], bytes[2], bytes[3]});
    } else {
      host::Ipv6Bytes address;
      std::copy(std::begin(bytes), std::end(bytes), address.begin());
      text = host::FormatIpv6(address);
    }
  }
  return corectl::Outside(Call::OnHost("ConvertHostAddress", {text.value_or("")}), [&] {
    const bool isAddress = hostId.hostnameInUse == IMA_FALSE;
    if (!isAddress && (!text || !host::HostFault(*text).empty())) {
      throw host::Error(host::Error::Kind::Invalid, "The record names no host by address or by name.");
    }
    return NodeCtl::Network::HostAddress(*text);
  });
}

}  // namespace CoreCtl::Storage

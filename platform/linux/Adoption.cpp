#include "linux/Adoption.h"

#include <sys/utsname.h>
#include <unistd.h>

#include <algorithm>

#include "host/Host.h"
#include "host/Schema.h"
#include "linux/Check.h"
#include "linux/Platform.h"
#include "store/Document.h"

namespace linux {

namespace {

using store::Kind;
using store::kRoot;
using store::Object;

constexpr std::string_view kCan[] = {
    "Static Discovery Settable",
    "Sendtarget Discovery Settable",
    "Authorization Method Settable",
    "CHAP Authorization Supported",
    "Mutual Authentication Supported",
    "Target Level Authentication Supported",
    "Target Level Mutual Authentication Supported",
    "Adapter Header Digest Supported",
    "Target Level Header Digest Supported",
    "Adapter Data Digest Supported",
    "Target Level Data Digest Supported",
    "IPv6 Supported",
    "DNS Based Address Supported",
    "Inheritance Supported",
    "Name And Alias Settable",
};

/// Calls @p visit with each object below @p parent, in their order.
template <class Visit>
void ForEachBelow(store::Tree& tree, const Object& parent, Visit visit) {
  for (const store::Collection& collection : store::GetKindSpec(parent.kind).collections) {
    for (const Object& child : tree.store::Tree::Children(parent.id, collection.kind)) visit(child);
  }
}

/// All of a host but its ids.
std::vector<std::pair<Kind, store::Record>> Contents(store::Tree& tree, const Object& object) {
  std::vector<std::pair<Kind, store::Record>> all{{object.kind, object.record}};
  ForEachBelow(tree, object, [&](const Object& child) {
    for (auto& below : Contents(tree, child)) all.push_back(std::move(below));
  });
  return all;
}

void Copy(store::Tree& from, const Object& object, std::int64_t parent, store::Tree& to) {
  const std::int64_t id = to.store::Tree::Insert(parent, object.kind, object.record).id;
  ForEachBelow(from, object, [&](const Object& child) { Copy(from, child, id, to); });
}

Object RootOf(store::Tree& tree) { return tree.store::Tree::Lookup(kRoot).value(); }

/// Runs @p work with the host that a first run finds.
template <class Work>
void WithNewHost(Work work) {
  const std::unique_ptr<host::Store> store = host::Platform::Current().NewStore();
  host::Transaction reading(*store, host::Transaction::Access::Read);
  store::Tree tree(*store);
  work(tree);
}

bool IsUntouched(store::Tree& tree) {
  bool isSame = false;
  WithNewHost(
      [&](store::Tree& made) { isSame = Contents(tree, RootOf(tree)) == Contents(made, RootOf(made)); });
  return isSame;
}

store::Record AdapterRecord(const std::string& name) {
  utsname system{};
  uname(&system);
  store::Record adapter;
  adapter.Set("name", "hba0");
  adapter.Set("kind", "software");
  adapter.Set("uid", name);
  adapter.Set("driver", "iscsi_tcp");
  adapter.Set("initiatorName", name);
  adapter.Set("alias", system.nodename);
  adapter.Set("properties/vendor", "Linux");
  adapter.Set("properties/model", "iscsi_tcp");
  adapter.Set("properties/description", "Linux software iSCSI initiator");
  adapter.Set("properties/driverName", "iscsi_tcp");
  adapter.Set("properties/driverVersion", system.release);
  adapter.Set("properties/tcpProtocolSupported", true);
  adapter.Set("properties/isInitiator", "true");
  for (const std::string_view capability : kCan) adapter.Set("capabilities/" + std::string(capability), true);
  // What Linux decides by itself, or does not do.
  for (const char* parameter : {"ErrorRecoveryLevel", "DelayedAck"})
    adapter.Set(std::string("parameters/") + parameter + "/settable", false);
  adapter.Set("download/fileSupported", 0);
  return adapter;
}

void Make(store::Tree& tree, const std::string& name) {
  store::Record host;
  host.Set(kMachineKey, kAdopted);
  store::Record plugin;
  plugin.Set("fileName", "libima.so");
  plugin.Set("vendor", "Linux");
  plugin.Set("autoPersistenceSupported", 1);
  tree.Clear();
  tree.store::Tree::Insert(0, Kind::Host, store::Complete(Kind::Host, host));
  tree.store::Tree::Insert(kRoot, Kind::Adapter, store::Complete(Kind::Adapter, AdapterRecord(name)));
  tree.store::Tree::Insert(kRoot, Kind::Plugin, store::Complete(Kind::Plugin, plugin));
}

}  // namespace

void Adopt(bool mayReplace) {
  std::string name;
  for (const Finding& finding : CheckMachine()) {
    if (!finding.isThere) {
      throw host::Error(host::Error::Kind::WrongState,
                        "This machine cannot be adopted yet, " + finding.found + ": " + finding.mend);
    }
    if (finding.part == kNamePart) name = finding.found;
  }
  host::Host::Current().Administer("Adopt()", host::Transaction::Access::Change, [&](host::Tree& tree) {
    if (!mayReplace && !IsUntouched(tree)) {
      throw host::Error(
          host::Error::Kind::Exists,
          "There is a host that was changed or described, which this machine would replace: say --replace"
          " if it may.");
    }
    Make(tree, name);
  });
}

void Release() {
  host::Host::Current().Administer("Release()", host::Transaction::Access::Change, [](host::Tree& tree) {
    if (!IsAdopted(tree))
      throw host::Error(host::Error::Kind::WrongState,
                        "The host is not this machine's own: nothing was adopted.");
    tree.Clear();
    WithNewHost([&](store::Tree& made) { Copy(made, RootOf(made), 0, tree); });
  });
}

}  // namespace linux

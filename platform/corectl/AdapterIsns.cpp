// The iSNS servers of an adapter, and PollInterval, which it has for itself and for each server.

#include "corectl/Adapter.h"
#include "host/Formats.h"
#include "host/NetworkSchema.h"

namespace corectl {

namespace {

using host::Kind;
using host::Quoted;

std::string Path(const std::string& prefix, const char* key) { return prefix + '/' + key; }

/// The parameter below @p prefix of @p record.
iSnsParms ParmsAt(const host::Record& record, const std::string& prefix) {
  iSnsParms parms;
  parms.current = record.GetInt(Path(prefix, "current"));
  parms.defaultValue = record.GetInt(Path(prefix, "default"));
  parms.min = record.GetInt(Path(prefix, "min"));
  parms.max = record.GetInt(Path(prefix, "max"));
  parms.settable = record.GetBool(Path(prefix, "settable"));
  parms.valid = record.GetBool(Path(prefix, "valid"));
  return parms;
}

/// Stores the value of @p parms below @p prefix; one that differs must be settable and in its range.
void StoreValue(host::Record& record, const std::string& prefix, const iSnsParms& parms) {
  const iSnsParms before = ParmsAt(record, prefix);
  if (parms.current == before.current) return;
  if (!before.valid || !before.settable) Deny(Why::NotSettable, "PollInterval is not settable.");
  if (parms.current < before.min || parms.current > before.max) {
    Deny(Why::OutOfRange, "PollInterval " + std::to_string(parms.current) + " is not from " +
                              std::to_string(before.min) + " to " + std::to_string(before.max) + ".");
  }
  record.Set(Path(prefix, "current"), parms.current);
}

constexpr char kAdapterPrefix[] = "isns";
constexpr char kServerPrefix[] = "parms";

/// As configured: what is read as a whole is changed and written back, and must not undo what waits.
iSnsParms AdapterParms(const host::Object& adapter) {
  return ParmsAt(host::Configured(adapter).record, kAdapterPrefix);
}

host::Record ServerRecord(const iSnsConfig& config) {
  const auto method = static_cast<std::size_t>(config.method);
  if (method >= std::size(host::kIsnsMethods))
    Deny(Why::Invalid, "There is no iSNS discovery method " + std::to_string(method) + ".");
  host::Record record;
  record.Set("method", host::kIsnsMethods[method]);
  record.Set("address", config.address.GetStringAddress());
  return record;
}

/// As messages and traces name it.
std::string ServerText(const iSnsConfig& config) { return config.address.GetStringAddress(); }

std::optional<host::Object> LookupServer(host::Tree& tree, const host::Object& adapter,
                                         const iSnsConfig& config) {
  return tree.Find(adapter.id, Kind::IsnsServer, host::NameOf(Kind::IsnsServer, ServerRecord(config)));
}

host::Object FindServer(host::Tree& tree, const host::Object& adapter, const iSnsConfig& config) {
  auto server = LookupServer(tree, adapter, config);
  if (!server) {
    Deny(Why::NotFound,
         "The adapter " + Quoted(adapter.name) + " has no iSNS server " + Quoted(ServerText(config)) + ".");
  }
  return *std::move(server);
}

void RequireIsnsSettable(const host::Object& adapter) {
  if (adapter.record.GetBool("capabilities/ISnS Settable")) return;
  Deny(Why::NotSettable, "The iSNS servers of the adapter " + Quoted(adapter.name) + " are not settable.");
}

}  // namespace

void Adapter::AddIsnsConfig(const iSnsConfig& config) {
  ref_.Change("AddIsnsConfig", {ServerText(config)}, [&](host::Tree& tree, const host::Object& adapter) {
    RequireIsnsSettable(adapter);
    if (LookupServer(tree, adapter, config)) {
      Deny(Why::Exists, "The adapter " + Quoted(adapter.name) + " has the iSNS server " +
                            Quoted(ServerText(config)) + " already.");
    }
    if (config.method != iSnsDiscoveryMethod::Static)
      Deny(Why::NotSupported, "Only static iSNS servers can be added.");
    tree.InsertNew(adapter.id, Kind::IsnsServer, ServerRecord(config));
  });
}

void Adapter::RemoveIsnsConfig(const iSnsConfig& config) {
  ref_.Change("RemoveIsnsConfig", {ServerText(config)}, [&](host::Tree& tree, const host::Object& adapter) {
    RequireIsnsSettable(adapter);
    tree.Remove(FindServer(tree, adapter, config).id);
  });
}

std::vector<iSnsConfig*> Adapter::GetIsnsConfigs() {
  auto configs = ref_.Read("GetIsnsConfigs", [](host::Tree& tree, const host::Object& adapter) {
    std::vector<std::unique_ptr<iSnsConfig>> owned;
    for (const host::Object& server : tree.Children(adapter.id, Kind::IsnsServer)) {
      const int method = server.record.GetWord("method", host::kIsnsMethods);
      owned.push_back(std::make_unique<iSnsConfig>());
      owned.back()->method = static_cast<iSnsDiscoveryMethod>(method);
      owned.back()->address = Network::HostAddress(server.record.GetString("address"));
    }
    return owned;
  });
  return HandOut(std::move(configs));
}

iSnsParms Adapter::GetIsnsParms(const iSnsConfig& config) {
  return ref_.Read("GetIsnsParms", {ServerText(config)}, [&](host::Tree& tree, const host::Object& adapter) {
    const host::Object server = FindServer(tree, adapter, config);
    iSnsParms parms = ParmsAt(server.record, kServerPrefix);
    parms.parent = adapter.name;
    parms.inherited = server.record.GetBool("inherited");
    if (parms.inherited) parms.current = AdapterParms(adapter).current;
    return parms;
  });
}

void Adapter::SetIsnsParms(const iSnsConfig& config, const iSnsParms& parms) {
  ref_.Change("SetIsnsParms", {ServerText(config), parms.current, parms.inherited},
              [&](host::Tree& tree, const host::Object& adapter) {
                host::Object server = FindServer(tree, adapter, config);
                server.record.Set("inherited", parms.inherited);
                if (!parms.inherited) StoreValue(server.record, kServerPrefix, parms);
                tree.Update(server);
              });
}

iSnsParms Adapter::GetAdapterIsnsParms() {
  return ref_.Read("GetAdapterIsnsParms",
                   [](host::Tree&, const host::Object& adapter) { return AdapterParms(adapter); });
}

Adapter::iScsiStatus Adapter::SetAdapterIsnsParms(const iSnsParms& parms) {
  return Configure("SetAdapterIsnsParms", {parms.current}, Setting::Isns,
                   [&](host::Object& adapter) { StoreValue(adapter.record, kAdapterPrefix, parms); });
}

}  // namespace corectl

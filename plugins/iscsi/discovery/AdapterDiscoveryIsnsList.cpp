#include "AdapterWalk.h"
#include "IscsiUtil/Refusal.h"
#include "UnregisteredCommands.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Storage::iSnsConfig;
using NodeCtl::Storage::iSnsDiscoveryMethod;

struct Server {
  const std::string& adapter;
  const iSnsConfig& config;
};

std::string MethodText(iSnsDiscoveryMethod method) {
  switch (method) {
    case iSnsDiscoveryMethod::Static:
      return "static";
    case iSnsDiscoveryMethod::Dhcp:
      return "dhcp";
    case iSnsDiscoveryMethod::Slp:
      return "slp";
  }
  IscsiUtil::Refuse("Invalid isns discovery method", "plugins/iscsi/discovery");
}

/// Only a static server has an address of its own.
std::string OwnAddress(const iSnsConfig& config) {
  return config.method == iSnsDiscoveryMethod::Static ? config.address.GetStringAddress() : "";
}

constexpr Column<Server> kColumns[] = {
    {"Adapter", [](const Server& server) { return server.adapter; }},
    {"Method", [](const Server& server) { return MethodText(server.config.method); }},
    {"iSNS", [](const Server& server) { return OwnAddress(server.config); }},
};
constexpr auto kServer = StructureOf<kColumns>("Isns");

constexpr Option kOptions[] = {AdapterFilter()};

}  // namespace

constexpr Declaration AdapterDiscoveryIsnsList::kDeclaration{
    .description = "List iSNS discovery addresses",
    .type = kFetcher,
    .formatter = "table",
    .formatterSettings = {FieldsFrom(0, kServer, "fields")},
    .options = kOptions,
    .result = ListResult(),
};

boost::shared_ptr<AdapterDiscoveryIsnsList> AdapterDiscoveryIsnsList::New() { return CommandFrame::New(); }

StructPtr AdapterDiscoveryIsnsList::GetListType() const { return NewPrototype(kServer); }

void AdapterDiscoveryIsnsList::ExecuteInternal(InputPtr input, OutputPtr output) {
  constexpr FailureReport kReport = ReportingReasonThen("Failed to list isns discovery addresses.");
  // Unlike the other listings, this one reports also what fails ahead of the walk.
  Guarded(output, kReport, [&] {
    ListAdapters(input, output, kReport, GetListType(), NothingPassedOver,
                 [](const ListedAdapter& listed, Plinth::MetaObj::MetaList& list) {
                   const OwnedVector<iSnsConfig> servers(listed.adapter.GetIsnsConfigs());
                   for (const iSnsConfig* server : servers) {
                     list.Append(NewRow(kServer, {listed.name, *server}));
                   }
                 });
  });
}

}  // namespace TessaroCli::IscsiNamespace

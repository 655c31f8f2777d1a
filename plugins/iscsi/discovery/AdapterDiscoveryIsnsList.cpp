#include "AdapterWalk.h"

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
  throw CoreCtl::Lib::CoreCtlException("Invalid isns discovery method", "plugins/iscsi/discovery", __LINE__,
                                       NodeCtl::Lib::NoticeMessage());
}

/// Only a static server has an address of its own.
std::string AddressText(const iSnsConfig& config) {
  return config.method == iSnsDiscoveryMethod::Static ? config.address.GetStringAddress() : "";
}

constexpr Column<Server> kColumns[] = {
    {"Adapter", [](const Server& server) { return server.adapter; }},
    {"Method", [](const Server& server) { return MethodText(server.config.method); }},
    {"iSNS", [](const Server& server) { return AddressText(server.config); }},
};
constexpr Structure kServer = StructureOf<kColumns>("Isns");

constexpr Parameter kParameters[] = {AdapterFilter()};

}  // namespace

class __attribute__((visibility("default"))) AdapterDiscoveryIsnsList
    : public CommandFrame<AdapterDiscoveryIsnsList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List iSNS discovery addresses",
      .type = kFetcher,
      .formatter = "table",
      .formatterParameters = {FieldsFrom(0, "fields")},
      .parameters = kParameters,
      .result = ListOf(kServer),
  };

  StructPtr GetListType() const { return NewPrototype(kServer); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ListAdapters(input, output, {"Failed to list isns discovery addresses.", FailureReport::Reason::First},
                 kServer, NothingPassedOver,
                 [](const ListedAdapter& listed, Plinth::MetaObj::MetaList& list) {
                   const OwnedVector<iSnsConfig> servers(listed.adapter.GetIsnsConfigs());
                   for (const iSnsConfig* server : servers) {
                     list.Append(NewRow(kServer, kColumns, {listed.name, *server}));
                   }
                 });
  }
};

template __attribute__((visibility("default"))) NodePtr Make<AdapterDiscoveryIsnsList>();

}  // namespace TessaroCli::IscsiNamespace

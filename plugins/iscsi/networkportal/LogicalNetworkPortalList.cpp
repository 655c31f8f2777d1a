#include "AdapterWalk.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Storage::iScsiLnpProperties;
using NodeCtl::Storage::iScsiNicProperties;
using NodeCtl::Storage::iScsiPortErrorCodes;

struct Portal {
  const std::string& adapter;
  const iScsiLnpProperties& portal;
  bool compliant;
};

constexpr Column<Portal> kColumns[] = {
    {"Adapter", [](const Portal& listed) { return listed.adapter; }},
    {"Hostnic", [](const Portal& listed) { return listed.portal.name; }},
    {"MAC Address", [](const Portal& listed) { return listed.portal.mac.GetStringAddress(); }},
    {"MAC Address Valid", [](const Portal& listed) { return listed.portal.mac.IsValid(); }},
    {"Compliant", [](const Portal& listed) { return listed.compliant; }},
};
constexpr Structure kPortal = StructureOf<kColumns>("LogicalNetworkPortal");

constexpr Parameter kParameters[] = {AdapterFilter()};

bool IsCompliant(iScsiInterface& adapter, const std::string& portal) {
  iScsiNicProperties nic;
  nic.name = portal;
  std::vector<iScsiNicProperties> nics;
  adapter.GetNicProperties(nic, nics);
  return nic.complianceCode == iScsiPortErrorCodes::Compliant;
}

}  // namespace

class LogicalNetworkPortalList : public CommandFrame<LogicalNetworkPortalList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List Logical Network Portals for iSCSI Adapter",
      .type = kFetcher,
      .formatter = "table",
      .formatterParameters = {FieldsFrom(0, "fields:LogicalNetworkPortal")},
      .parameters = kParameters,
      .result = ListOf(kPortal),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kPortal); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ListAdapters(input, output, {"Failed to list logical network portals."}, kPortal,
                 LacksCall<LnpListNotSupportedMessage>,
                 [](const ListedAdapter& listed, Plinth::MetaObj::MetaList& list) {
                   std::vector<iScsiLnpProperties> portals;
                   listed.adapter.GetLogicalNetworkPortals(portals);
                   for (const iScsiLnpProperties& portal : portals) {
                     const bool compliant = IsCompliant(listed.adapter, portal.name);
                     list.Append(NewRow(kPortal, kColumns, {listed.name, portal, compliant}));
                   }
                 });
  }
};

template NodePtr Make<LogicalNetworkPortalList>();

}  // namespace TessaroCli::IscsiNamespace

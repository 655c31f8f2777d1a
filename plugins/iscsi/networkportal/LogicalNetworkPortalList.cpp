#include "AdapterWalk.h"
#include "networkportal/MissingCall.h"

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
constexpr auto kPortal = StructureOf<kColumns>("LogicalNetworkPortal");

constexpr Option kOptions[] = {AdapterFilter()};

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
      .formatterSettings = {FieldsFrom(0, kPortal, "fields:LogicalNetworkPortal")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kPortal); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ListAdapters(input, output, Reporting("Failed to list logical network portals."), GetOutputStructure(),
                 LacksLnpList, [](const ListedAdapter& listed, Plinth::MetaObj::MetaList& list) {
                   std::vector<iScsiLnpProperties> portals;
                   listed.adapter.GetLogicalNetworkPortals(portals);
                   for (const iScsiLnpProperties& portal : portals) {
                     const bool compliant = IsCompliant(listed.adapter, portal.name);
                     list.Append(NewRow(kPortal, {listed.name, portal, compliant}));
                   }
                 });
  }
};

template NodePtr Make<LogicalNetworkPortalList>();

}  // namespace TessaroCli::IscsiNamespace

#include "AdapterWalk.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Storage::iScsiPnpProperties;

struct Portal {
  const std::string& adapter;
  const iScsiPnpProperties& portal;
};

constexpr Column<Portal> kColumns[] = {
    {"Adapter", [](const Portal& listed) { return listed.adapter; }},
    {"Phynic", [](const Portal& listed) { return listed.portal.name; }},
    {"MAC Address", [](const Portal& listed) { return listed.portal.mac.GetStringAddress(); }},
    {"MAC Address Valid", [](const Portal& listed) { return listed.portal.mac.IsValid(); }},
    {"Current Speed",
     [](const Portal& listed) { return static_cast<long long>(listed.portal.currentSpeed); }},
    {"Max Speed", [](const Portal& listed) { return static_cast<long long>(listed.portal.maxSpeed); }},
    {"Max Frame Size",
     [](const Portal& listed) { return static_cast<long long>(listed.portal.maxFrameSize); }},
};
constexpr Structure kPortal = StructureOf<kColumns>("PhysicalNetworkPortal");

constexpr Parameter kParameters[] = {AdapterFilter()};

}  // namespace

class PhysicalNetworkPortalList : public CommandFrame<PhysicalNetworkPortalList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List Physical Network Portal for iSCSI Adapter",
      .type = kFetcher,
      .formatter = "table",
      .formatterParameters = {FieldsFrom(0, "fields:PhysicalNetworkPortal")},
      .parameters = kParameters,
      .result = ListOf(kPortal),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kPortal); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ListAdapters(input, output, {"Failed to list physical network portals."}, kPortal, EverythingPassedOver,
                 [](const ListedAdapter& listed, Plinth::MetaObj::MetaList& list) {
                   std::vector<iScsiPnpProperties> portals;
                   listed.adapter.GetPhysicalNetworkPortals(portals);
                   for (const iScsiPnpProperties& portal : portals) {
                     list.Append(NewRow(kPortal, kColumns, {listed.name, portal}));
                   }
                 });
  }
};

template NodePtr Make<PhysicalNetworkPortalList>();

}  // namespace TessaroCli::IscsiNamespace

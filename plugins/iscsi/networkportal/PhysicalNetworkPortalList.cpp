#include "AdapterWalk.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Storage::iScsiPnpProperties;

struct Portal {
  const std::string& adapter;
  const iScsiPnpProperties& properties;
};

constexpr Column<Portal> kColumns[] = {
    {"Adapter", [](const Portal& listed) { return listed.adapter; }},
    {"Phynic", Property<&iScsiPnpProperties::name>},
    {"MAC Address", [](const Portal& listed) { return listed.properties.mac.GetStringAddress(); }},
    {"MAC Address Valid", [](const Portal& listed) { return listed.properties.mac.IsValid(); }},
    {"Current Speed", Property<&iScsiPnpProperties::currentSpeed>},
    {"Max Speed", Property<&iScsiPnpProperties::maxSpeed>},
    {"Max Frame Size", Property<&iScsiPnpProperties::maxFrameSize>},
};
constexpr auto kPortal = StructureOf<kColumns>("PhysicalNetworkPortal");

constexpr Option kOptions[] = {AdapterFilter()};

}  // namespace

class PhysicalNetworkPortalList : public CommandFrame<PhysicalNetworkPortalList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List Physical Network Portal for iSCSI Adapter",
      .type = kFetcher,
      .formatter = "table",
      .formatterSettings = {FieldsFrom(0, kPortal, "fields:PhysicalNetworkPortal")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kPortal); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ListAdapters(input, output, Reporting("Failed to list physical network portals."), GetOutputStructure(),
                 EverythingPassedOver, [](const ListedAdapter& listed, Plinth::MetaObj::MetaList& list) {
                   std::vector<iScsiPnpProperties> portals;
                   listed.adapter.GetPhysicalNetworkPortals(portals);
                   for (const iScsiPnpProperties& portal : portals) {
                     list.Append(NewRow(kPortal, {listed.name, portal}));
                   }
                 });
  }
};

template NodePtr Make<PhysicalNetworkPortalList>();

}  // namespace TessaroCli::IscsiNamespace

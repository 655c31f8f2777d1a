#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using Properties = NodeCtl::Storage::iScsiPhysicalHbaProperties;

struct Shown {
  iScsiInterface& adapter;
  Properties properties;
};

/// A property that may be unknown, as a word.
template <auto member>
constexpr auto Known =
    [](const Shown& shown) { return IscsiTools::ConvertExtendedBoolToString(shown.properties.*member); };

constexpr Column<Shown> kColumns[] = {
    {"ID", [](const Shown& shown) { return shown.adapter.GetName(); }},
    {"Name", [](const Shown& shown) { return shown.adapter.GetInitiatorName(); }},
    {"Alias", [](const Shown& shown) { return shown.adapter.GetInitiatorAlias(); }},
    {"Vendor", Property<&Properties::vendor>},
    {"Model", Property<&Properties::model>},
    {"Description", Property<&Properties::description>},
    {"Serial Number", Property<&Properties::serialNumber>},
    {"Hardware Version", Property<&Properties::hardwareVersion>},
    {"Asic Version", Property<&Properties::asicVersion>},
    {"Firmware Version", Property<&Properties::firmwareVersion>},
    {"Option Rom Version", Property<&Properties::optionRomVersion>},
    {"Driver Name", Property<&Properties::driverName>},
    {"Driver Version", Property<&Properties::driverVersion>},
    {"TCP Protocol Supported", Property<&Properties::tcpProtocolSupported>},
    {"Bidirectional Transfers Supported", Known<&Properties::bidirectionalTransfersSupported>},
    {"Maximum Cdb Length", Property<&Properties::maximumCdbLength>},
    {"Can Be NIC", Known<&Properties::canBeNic>},
    {"Is NIC", Known<&Properties::isNic>},
    {"Is Initiator", Known<&Properties::isInitiator>},
    {"Is Target", Known<&Properties::isTarget>},
    {"Using TCP Offload Engine", Known<&Properties::usingTcpOffloadEngine>},
    {"Using ISCSI Offload Engine", Known<&Properties::usingIscsiOffloadEngine>},
};
constexpr auto kInfo = StructureOf<kColumns>("AdapterInfo");

constexpr Option kOptions[] = {AdapterOption()};

}  // namespace

class AdapterGet : public CommandFrame<AdapterGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List the iSCSI information for the iSCSI Host Bus Adapter.",
      .type = kFetcher,
      .formatter = "simple",
      .formatterSettings = {Setting("header:AdapterInfo", "%ID%"), FieldsFrom(1, kInfo, "fields")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kInfo); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, Reporting("Unable to get adapter information."), [&](iScsiInterface& adapter) {
      const ListPtr list = NewList(GetOutputStructure());
      list->Append(NewRow(kInfo, {adapter, adapter.GetPhysicalHbaProperties()}));
      Post(output, list);
    });
  }
};

template NodePtr Make<AdapterGet>();

}  // namespace TessaroCli::IscsiNamespace

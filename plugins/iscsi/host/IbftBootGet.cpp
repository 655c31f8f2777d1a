#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using Table = NodeCtl::Storage::iScsiBootTable;

struct Shown {
  Table properties;
};

constexpr Column<Shown> kColumns[] = {
    {"Target Name", Property<&Table::GetTargetName>},
    {"Target IP", Property<&Table::GetTargetIP>},
    {"Target Port", Property<&Table::GetTargetPort>},
    {"Target Boot Flags", Property<&Table::GetTargetBootFlags>},
    {"Lun", Property<&Table::GetLun>},
    {"MAC Address", Property<&Table::GetMacAddress>},
    {"IP Address", Property<&Table::GetNicIP>},
    {"Subnet Mask", Property<&Table::GetNicSubnetMask>},
    {"Gateway", Property<&Table::GetNicGateway>},
    {"Dhcp", IsSet<&Table::GetNicDhcp>},
    {"Vlan", Property<&Table::GetNicVlan>},
    {"NIC Flags", Property<&Table::GetNicFlags>},
    {"Chap Type", Property<&Table::GetChapType>},
    {"Chap Name", Property<&Table::GetChapName>},
    {"Mutual Chap Name", Property<&Table::GetReverseChapName>},
    {"SLP Server IP", Property<&Table::GetSlpIP>},
    {"Initiator Name", Property<&Table::GetInitiatorName>},
    {"Initiator Alias", Property<&Table::GetInitiatorAlias>},
    {"Initiator Boot Flags", Property<&Table::GetInitiatorBootFlags>},
    {"Enabled", IsSet<&Table::GetEnabled>},
};
constexpr auto kBoot = StructureOf<kColumns>("IbftBoot");

}  // namespace

class IbftBootGet : public CommandFrame<IbftBootGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get iSCSI IBFT Boot details.",
      .type = kFetcher,
      .formatter = "simple",
      .formatterSettings = {Setting("header:IbftBoot", "%Target Name%"),
                            Setting(
                                "fields",
                                "Target IP,Target Port,Lun,Target Boot Flags,MAC Address,IP Address,Subnet "
                                "Mask,Gateway,Dhcp,Vlan,NIC Flags,Chap Type,Chap Name,Mutual Chap Name,SLP "
                                "Server IP,Initiator Name,Initiator Alias,Initiator Boot Flags,Enabled")},
      .result = ListResult(),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kBoot); }

 private:
  void ExecuteInternal(InputPtr, OutputPtr output) override {
    CoreCtl::Storage::StorageInfoImpl storage;
    const ListPtr list = NewList(GetOutputStructure());
    Guarded(output, Reporting("Unable to get boot tables."), [&] {
      list->Append(NewRow(kBoot, {storage.GetiScsiBootTables().GetPrimary()}));
      Post(output, list);
    });
  }
};

template NodePtr Make<IbftBootGet>();

}  // namespace TessaroCli::IscsiNamespace

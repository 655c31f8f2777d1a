#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using Table = NodeCtl::Storage::iScsiBootTable;

template <auto getter>
constexpr auto Member = [](const Table& table) { return (table.*getter)(); };

constexpr Column<Table> kColumns[] = {
    {"Target Name", Member<&Table::GetTargetName>},
    {"Target IP", Member<&Table::GetTargetIP>},
    {"Target Port", Member<&Table::GetTargetPort>},
    {"Target Boot Flags", Member<&Table::GetTargetBootFlags>},
    {"Lun", [](const Table& table) { return static_cast<long long>(table.GetLun()); }},
    {"MAC Address", Member<&Table::GetMacAddress>},
    {"IP Address", Member<&Table::GetNicIP>},
    {"Subnet Mask", Member<&Table::GetNicSubnetMask>},
    {"Gateway", Member<&Table::GetNicGateway>},
    {"Dhcp", [](const Table& table) { return table.GetNicDhcp() != 0; }},
    {"Vlan", Member<&Table::GetNicVlan>},
    {"NIC Flags", Member<&Table::GetNicFlags>},
    {"Chap Type", Member<&Table::GetChapType>},
    {"Chap Name", Member<&Table::GetChapName>},
    {"Mutual Chap Name", Member<&Table::GetReverseChapName>},
    {"SLP Server IP", Member<&Table::GetSlpIP>},
    {"Initiator Name", Member<&Table::GetInitiatorName>},
    {"Initiator Alias", Member<&Table::GetInitiatorAlias>},
    {"Initiator Boot Flags", Member<&Table::GetInitiatorBootFlags>},
    {"Enabled", [](const Table& table) { return table.GetEnabled() != 0; }},
};
constexpr Structure kBoot = StructureOf<kColumns>("IbftBoot");

}  // namespace

class IbftBootGet : public CommandFrame<IbftBootGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get iSCSI IBFT Boot details.",
      .type = kFetcher,
      .formatter = "simple",
      .formatterParameters = {Setting("header:IbftBoot", "%Target Name%"),
                              Setting(
                                  "fields",
                                  "Target IP,Target Port,Lun,Target Boot Flags,MAC Address,IP Address,Subnet "
                                  "Mask,Gateway,Dhcp,Vlan,NIC Flags,Chap Type,Chap Name,Mutual Chap Name,SLP "
                                  "Server IP,Initiator Name,Initiator Alias,Initiator Boot Flags,Enabled")},
      .result = ListOf(kBoot),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kBoot); }

 private:
  void ExecuteInternal(InputPtr, OutputPtr output) override {
    CoreCtl::Storage::StorageInfoImpl storage;
    const ListPtr list = NewList(kBoot);
    Guarded(output, {"Unable to get boot tables."}, [&] {
      list->Append(NewRow(kBoot, kColumns, storage.GetiScsiBootTables().GetPrimary()));
      Post(output, list);
    });
  }
};

template NodePtr Make<IbftBootGet>();

}  // namespace TessaroCli::IscsiNamespace

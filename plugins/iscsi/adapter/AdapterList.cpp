#include "CommandFrame.h"
#include "OwnedVector.h"

namespace TessaroCli::IscsiNamespace {
namespace {

std::string StateText(iScsiInterface::iScsiAdapterState state) {
  switch (state) {
    case iScsiInterface::iScsiAdapterState::Online:
      return "online";
    case iScsiInterface::iScsiAdapterState::Offline:
      return "offline";
    case iScsiInterface::iScsiAdapterState::Unbound:
      return "unbound";
  }
  return "unknown";
}

struct Listed {
  iScsiInterface& adapter;
  NodeCtl::Storage::iScsiPhysicalHbaProperties properties;
  iScsiInterface::iScsiAdapterState state;
};

constexpr Column<Listed> kColumns[] = {
    {"Adapter", [](const Listed& listed) { return listed.adapter.GetName(); }},
    {"State", [](const Listed& listed) { return StateText(listed.state); }},
    {"Driver", [](const Listed& listed) { return listed.adapter.GetDriverName(); }},
    {"UID", [](const Listed& listed) { return listed.adapter.GetAdapterUid(); }},
    {"Description", [](const Listed& listed) { return listed.properties.description; }},
};
constexpr Structure kAdapter = StructureOf<kColumns>("iScsiAdapter");

constexpr Parameter kParameters[] = {AdapterFilter()};

}  // namespace

class AdapterList : public CommandFrame<AdapterList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List all the iSCSI Host Bus Adapters on the system.",
      .type = kFetcher,
      .formatter = "table",
      .formatterParameters = {Setting("fields:iScsiAdapter", "Adapter,Driver,State,UID,Description")},
      .parameters = kParameters,
      .result = BareListOf(kAdapter),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kAdapter); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    const ListPtr list = NewList(kAdapter);
    const bool limited = input->HasParameter("adapter");
    bool found = !limited;
    const bool listed = Guarded(output, {"Unable to list adapters."}, [&] {
      CoreCtl::Storage::StorageInfoImpl storage;
      const OwnedVector<iScsiInterface> adapters(storage.GetiScsiInterfaces());
      for (iScsiInterface* adapter : adapters) {
        if (adapter == nullptr) continue;
        if (limited && adapter->GetName() != input->GetString("adapter")) continue;
        const auto properties = adapter->GetPhysicalHbaProperties();
        const auto state = adapter->GetAdapterState();
        list->Append(NewRow(kAdapter, kColumns, {*adapter, properties, state}));
        found = true;
      }
    });
    if (!listed) return;
    if (!found) return output->ReportError(InvalidAdapterMessage);
    Post(output, list);
  }
};

template NodePtr Make<AdapterList>();

}  // namespace TessaroCli::IscsiNamespace

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
constexpr auto kAdapter = StructureOf<kColumns>("iScsiAdapter");

constexpr Option kOptions[] = {AdapterFilter()};

}  // namespace

class AdapterList : public CommandFrame<AdapterList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List all the iSCSI Host Bus Adapters on the system.",
      .type = kFetcher,
      .formatter = "table",
      .formatterSettings = {Setting("fields:iScsiAdapter", "Adapter,Driver,State,UID,Description")},
      .options = kOptions,
      .result = BareListResult(),
  };

  StructPtr GetOutputStructure() const { return NewPrototype(kAdapter); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    const ListPtr list = NewList(GetOutputStructure());
    Guarded(output, Reporting("Unable to list adapters."), [&] {
      if (!AppendAdapters(*input, *list)) return output->ReportError(InvalidAdapterMessage);
      Post(output, list);
    });
  }

  /// A row for each adapter, or for the one that was named; false where the host has none of that name. This
  /// is not the walk of ListAdapters: that takes an empty name for none given, and ends at the adapter that
  /// it names.
  static bool AppendAdapters(const Plinth::CallSpec::Input& input, Plinth::MetaObj::MetaList& list) {
    const bool named = input.HasParameter("adapter");
    bool found = !named;
    CoreCtl::Storage::StorageInfoImpl storage;
    const OwnedVector<iScsiInterface> adapters(storage.GetiScsiInterfaces());
    for (iScsiInterface* adapter : adapters) {
      if (adapter == nullptr) continue;
      if (named && adapter->GetName() != input.GetString("adapter")) continue;
      const auto properties = adapter->GetPhysicalHbaProperties();
      const auto state = adapter->GetAdapterState();
      list.Append(NewRow(kAdapter, {*adapter, properties, state}));
      found = true;
    }
    return found;
  }
};

template NodePtr Make<AdapterList>();

}  // namespace TessaroCli::IscsiNamespace

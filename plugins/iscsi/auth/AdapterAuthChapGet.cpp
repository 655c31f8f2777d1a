#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Column<ShownChap> kColumns[] = {
    {"Adapter", [](const ShownChap& shown) { return shown.place; }},
    kDirectionColumn,
    kNameColumn,
    kLevelColumn,
};
constexpr auto kChap = StructureOf<kColumns>("AdapterChapAuth");

constexpr Option kOptions[] = {
    AdapterOption(),
    ChapDirection("The iSCSI CHAP authentication direction. Options are:%ENUM%"),
};

}  // namespace

class AdapterAuthChapGet : public CommandFrame<AdapterAuthChapGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get the iSCSI CHAP authentication for the iSCSI Host Bus Adapter.",
      .type = kFetcher,
      .formatter = "simple",
      .formatterSettings = {Setting("header:AdapterAuth", "%Adapter%"), FieldsFrom(1, kChap, "fields")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetListType() const { return NewPrototype(kChap); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    constexpr char kFailure[] = "Failed to get iSCSI CHAP authentication configuration.";
    WithAdapter(input, output, Reporting(kFailure), [&](iScsiInterface& adapter) {
      const auto direction = ChapDirectionFrom(input->GetString("direction"), output);
      if (!direction) return;
      iScsiChapParameters entry;
      adapter.GetChapParameters(entry, *direction);
      const ListPtr list = NewList(GetListType());
      list->Append(NewRow(kChap, {input->GetString("adapter"), *direction, entry}));
      Post(output, list);
    });
  }
};

template NodePtr Make<AdapterAuthChapGet>();

}  // namespace TessaroCli::IscsiNamespace

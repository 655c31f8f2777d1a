#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Column<ShownChap> kColumns[] = {
    {"Sendtarget", [](const ShownChap& shown) { return shown.place; }},
    kDirectionColumn,
    kNameColumn,
    kLevelColumn,
    kInheritanceColumn,
    kParentColumn,
};
constexpr auto kChap = StructureOf<kColumns>("Sendtarget");

constexpr Option kOptions[] = {
    AdapterOption(),
    SendTargetAddress(),
    ChapDirection("The iSCSI authentication direction. Options are:%ENUM%"),
};

}  // namespace

class AdapterDiscoverySendtargetAuthChapGet : public CommandFrame<AdapterDiscoverySendtargetAuthChapGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get iSCSI CHAP authentication on a sendtarget address",
      .type = kFetcher,
      .formatter = "simple",
      .formatterSettings = {Setting("header:Sendtarget", "%Sendtarget%"), FieldsFrom(1, kChap, "fields")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetListType() const { return NewPrototype(kChap); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    constexpr char kFailure[] = "Failed to get iSCSI CHAP authentication configuration.";
    WithAdapter(input, output, Reporting(kFailure), [&](iScsiInterface& adapter) {
      const std::string text = input->GetString("address");
      const std::string word = input->GetString("direction");
      const TargetAddress address = IscsiTools::GetTargetAddressFromString(text);
      const iScsiParms parms = adapter.GetSendTargetParms(address);
      const auto direction = ChapDirectionFrom(word, output);
      if (!direction) return;
      iScsiChapParameters entry;
      adapter.GetSendTargetChapParameters(address, entry, *direction);
      const ListPtr list = NewList(GetListType());
      list->Append(
          NewRow(kChap, {IscsiTools::GetStringFromTargetAddress(address), *direction, entry, parms}));
      Post(output, list);
    });
  }
};

template NodePtr Make<AdapterDiscoverySendtargetAuthChapGet>();

}  // namespace TessaroCli::IscsiNamespace

#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Column<ShownChap> kColumns[] = {
    {"Sendtarget", [](const ShownChap& shown) { return shown.level.Address(); }},
    kDirectionColumn,
    kNameColumn,
    kLevelColumn,
    kInheritanceColumn,
    kParentColumn,
};
constexpr Structure kChap = StructureOf<kColumns>("Sendtarget");

constexpr Parameter kParameters[] = {
    Adapter(),
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
      .formatterParameters = {Setting("header:Sendtarget", "%Sendtarget%"), FieldsFrom(1, "fields")},
      .parameters = kParameters,
      .result = ListOf(kChap),
  };

  StructPtr GetListType() const { return NewPrototype(kChap); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ShowChap(kSendTargetLevel, kChap, NewRowOf<kChap, kColumns>, input, output);
  }
};

template NodePtr Make<AdapterDiscoverySendtargetAuthChapGet>();

}  // namespace TessaroCli::IscsiNamespace

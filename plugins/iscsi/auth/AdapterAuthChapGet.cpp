#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Column<ShownChap> kColumns[] = {
    {"Adapter", [](const ShownChap& shown) { return shown.adapter; }},
    kDirectionColumn,
    kNameColumn,
    kLevelColumn,
};
constexpr Structure kChap = StructureOf<kColumns>("AdapterChapAuth");

constexpr Parameter kParameters[] = {
    Adapter(),
    ChapDirection("The iSCSI CHAP authentication direction. Options are:%ENUM%"),
};

}  // namespace

class AdapterAuthChapGet : public CommandFrame<AdapterAuthChapGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get the iSCSI CHAP authentication for the iSCSI Host Bus Adapter.",
      .type = kFetcher,
      .formatter = "simple",
      .formatterParameters = {Setting("header:AdapterAuth", "%Adapter%"), FieldsFrom(1, "fields")},
      .parameters = kParameters,
      .result = ListOf(kChap),
  };

  StructPtr GetListType() const { return NewPrototype(kChap); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ShowChap(kAdapterLevel, kChap, NewRowOf<kChap, kColumns>, input, output);
  }
};

template NodePtr Make<AdapterAuthChapGet>();

}  // namespace TessaroCli::IscsiNamespace

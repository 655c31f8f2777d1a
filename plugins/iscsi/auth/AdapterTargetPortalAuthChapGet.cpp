#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Column<ShownChap> kColumns[] = {
    {"TargetName", [](const ShownChap& shown) { return shown.level.TargetName(); }},
    {"Address", [](const ShownChap& shown) { return shown.level.Address(); }},
    {"Method", [](const ShownChap&) { return "chap"; }},
    kDirectionColumn,
    kNameColumn,
    kLevelColumn,
    kInheritanceColumn,
    kParentColumn,
};
constexpr Structure kChap = StructureOf<kColumns>("TargetAuth");

constexpr const char* kMethods[] = {"chap"};

constexpr Parameter kParameters[] = {
    Adapter(),
    TargetName(),
    PortalAddress(),
    String("method", 'm', "The iSCSI authentication method. Options are:%ENUM%").OneOf(kMethods),
    ChapDirection("The iSCSI authentication direction. Options are:%ENUM%"),
};

}  // namespace

class AdapterTargetPortalAuthChapGet : public CommandFrame<AdapterTargetPortalAuthChapGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get iSCSI CHAP authentication on a target",
      .type = kFetcher,
      .formatter = "simple",
      .formatterParameters = {Setting("header:TargetAuth", "%TargetName%"),
                              Setting("fields",
                                      "Address,TargetName,Method,Direction,Name,Level,Inheritance,Parent")},
      .parameters = kParameters,
      .result = ListOf(kChap),
  };

  StructPtr GetListType() const { return NewPrototype(kChap); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ShowChap(kTargetLevel, kChap, NewRowOf<kChap, kColumns>, input, output);
  }
};

template NodePtr Make<AdapterTargetPortalAuthChapGet>();

}  // namespace TessaroCli::IscsiNamespace

#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Column<ShownChap> kColumns[] = {
    {"TargetName", [](const ShownChap& shown) { return shown.target; }},
    {"Address", [](const ShownChap& shown) { return shown.place; }},
    {"Method", [](const ShownChap&) { return "chap"; }},
    kDirectionColumn,
    kNameColumn,
    kLevelColumn,
    kInheritanceColumn,
    kParentColumn,
};
constexpr auto kChap = StructureOf<kColumns>("TargetAuth");

constexpr const char* kMethods[] = {"chap"};

constexpr Option kOptions[] = {
    AdapterOption(),
    TargetName(),
    PortalAddress(),
    StringOption("method", 'm', "The iSCSI authentication method. Options are:%ENUM%").OneOf(kMethods),
    ChapDirection("The iSCSI authentication direction. Options are:%ENUM%"),
};

}  // namespace

class AdapterTargetPortalAuthChapGet : public CommandFrame<AdapterTargetPortalAuthChapGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get iSCSI CHAP authentication on a target",
      .type = kFetcher,
      .formatter = "simple",
      .formatterSettings = {Setting("header:TargetAuth", "%TargetName%"),
                            Setting("fields",
                                    "Address,TargetName,Method,Direction,Name,Level,Inheritance,Parent")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetListType() const { return NewPrototype(kChap); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    constexpr char kFailure[] = "Failed to get CHAP authentication configuration.";
    WithAdapter(input, output, Reporting(kFailure), [&](iScsiInterface& adapter) {
      const std::string name = input->GetString("name");
      const std::string address = input->GetString("address");
      const std::string method = input->HasParameter("method") ? input->GetString("method") : "chap";
      const std::string word = input->GetString("direction");
      const std::vector<StaticTarget> targets = TargetsNamed(adapter, name, address);
      if (method != "chap") return output->ReportError(InvalidAuthMethodMessage);
      const auto direction = ChapDirectionFrom(word, output);
      if (!direction) return;
      const ListPtr list = NewList(GetListType());
      for (const StaticTarget& target : targets) {
        const iScsiParms parms = adapter.GetTargetParms(target);
        iScsiChapParameters entry;
        adapter.GetTargetChapParameters(target, entry, *direction);
        list->Append(NewRow(kChap, {IscsiTools::GetStringFromTargetAddress(target.address), *direction, entry,
                                    parms, target.name}));
      }
      Post(output, list);
    });
  }
};

template NodePtr Make<AdapterTargetPortalAuthChapGet>();

}  // namespace TessaroCli::IscsiNamespace

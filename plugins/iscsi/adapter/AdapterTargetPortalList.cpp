#include "ImaWalk.h"

namespace TessaroCli::IscsiNamespace {
namespace {

struct Listed {
  const ImaWalk::Target& target;
  const IMA_ADDRESS_KEY& key;

  std::string IfPresent(IMA_UINT16 number) const {
    return key.portAndTagPresent == 1 ? std::to_string(number) : "na";
  }
};

constexpr Column<Listed> kColumns[] = {
    {"ID", [](const Listed& listed) { return listed.target.Id(); }},
    {"Adapter", [](const Listed& listed) { return listed.target.adapter.name; }},
    {"Target", [](const Listed& listed) { return listed.target.name; }},
    {"IP", [](const Listed& listed) { return AddressText(listed.key.address); }},
    {"Port", [](const Listed& listed) { return listed.IfPresent(listed.key.portNumber); }},
    {"Tpgt", [](const Listed& listed) { return listed.IfPresent(listed.key.targetPortalGroupTag); }},
};
constexpr auto kTargetPortal = StructureOf<kColumns>("TargetPortal");

constexpr Option kOptions[] = {
    AdapterFilter(),
    TargetFilter(),
};

}  // namespace

class AdapterTargetPortalList : public CommandFrame<AdapterTargetPortalList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List iSCSI target portals.",
      .type = kFetcher,
      .formatter = "table",
      .formatterSettings = {Setting("fields:TargetPortal", "Adapter,Target,IP,Port,Tpgt")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetListType() const { return NewPrototype(kTargetPortal); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    PostImaList(output, GetListType(), [&](auto& list) {
      ImaWalk(input).Targets([&](const ImaWalk::Target& target) {
        for (const IMA_ADDRESS_KEY& key :
             ImaAddressKeys("Unable to get address keys.", IMA_GetAddressKeys, target.oid)) {
          list.Append(NewRow(kTargetPortal, {target, key}));
        }
      });
    });
  }
};

template NodePtr Make<AdapterTargetPortalList>();

}  // namespace TessaroCli::IscsiNamespace

#include <ima/ima_tsr.h>

#include "ImaWalk.h"

namespace TessaroCli::IscsiNamespace {
namespace {

struct Listed {
  const ImaWalk::Adapter& adapter;
  IMA_OID oid;
  const IMA_STATIC_DISCOVERY_TARGET_PROPERTIES& properties;
};

std::string AddressOf(const Listed& listed) {
  return IscsiTools::GetStringFromTargetAddress(
      {CoreCtl::Storage::iScsiUtil::ConvertHostAddress(listed.properties.targetAddress),
       listed.properties.port});
}

std::string PortalGroupOf(const Listed& listed) {
  if (listed.properties.tpgtPresent != 1) return "na";
  return std::to_string(listed.properties.tpgt & 0xffffu);
}

/// Whether it is a boot target; a host that cannot tell is no failure.
std::string BootMarkOf(const Listed& listed) {
  IMA_UINT32 mark = 0;
  const IMA_STATUS status =
      IMA_TSR_GetInternalConfigData(listed.oid, IMA_TSR_CONFIG_BOOT_TARGET, &mark, sizeof mark);
  if (status != IMA_STATUS_SUCCESS) return "na";
  return mark == 1 ? "true" : "false";
}

constexpr Column<Listed> kColumns[] = {
    {"Adapter", [](const Listed& listed) { return listed.adapter.name; }},
    {"Target Name", [](const Listed& listed) { return NarrowText(listed.properties.targetName, kNameSize); }},
    {"Target Address", [](const Listed& listed) { return AddressOf(listed); }},
    {"TPGT", [](const Listed& listed) { return PortalGroupOf(listed); }},
    {"Boot", [](const Listed& listed) { return BootMarkOf(listed); }},
};
constexpr auto kStatictarget = StructureOf<kColumns>("Statictarget");

constexpr Option kOptions[] = {AdapterFilter()};

constexpr char kListFailure[] = "Unable to get static target list.";
constexpr char kPropertiesFailure[] = "Unable to get logical adapter properties.";

}  // namespace

class AdapterDiscoveryStatictargetList : public CommandFrame<AdapterDiscoveryStatictargetList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List static target addresses",
      .type = kFetcher,
      .formatter = "table",
      .formatterSettings = {FieldsFrom(0, kStatictarget, "fields:Statictarget")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetListType() const { return NewPrototype(kStatictarget); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    PostImaList(output, GetListType(), [&](Plinth::MetaObj::MetaList& list) {
      ImaWalk(input).Adapters([&](const ImaWalk::Adapter& adapter) {
        for (const IMA_OID& oid : ImaList(kListFailure, IMA_GetStaticDiscoveryTargetOidList, adapter.oid)) {
          const auto properties = ReadIma(IMA_GetStaticDiscoveryTargetProperties, oid, kPropertiesFailure);
          list.Append(NewRow(kStatictarget, {adapter, oid, properties}));
        }
      });
    });
  }
};

template NodePtr Make<AdapterDiscoveryStatictargetList>();

}  // namespace TessaroCli::IscsiNamespace

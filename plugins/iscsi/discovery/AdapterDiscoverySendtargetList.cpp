#include "AdapterWalk.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Storage::TargetAddress;

struct Listed {
  const std::string& adapter;
  const TargetAddress& address;
};

constexpr Column<Listed> kColumns[] = {
    {"Adapter", [](const Listed& listed) { return listed.adapter; }},
    {"Sendtarget",
     [](const Listed& listed) { return IscsiTools::GetStringFromTargetAddress(listed.address); }},
};
constexpr Structure kSendtarget = StructureOf<kColumns>("Sendtarget");

constexpr Parameter kParameters[] = {AdapterFilter()};

}  // namespace

class AdapterDiscoverySendtargetList : public CommandFrame<AdapterDiscoverySendtargetList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List sendtarget addresses",
      .type = kFetcher,
      .formatter = "table",
      .formatterParameters = {FieldsFrom(0, "fields:Sendtarget")},
      .parameters = kParameters,
      .result = ListOf(kSendtarget),
  };

  StructPtr GetListType() const { return NewPrototype(kSendtarget); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ListAdapters(input, output, {"Failed to list sendtargets."}, kSendtarget, NothingPassedOver,
                 [](const ListedAdapter& listed, Plinth::MetaObj::MetaList& list) {
                   const OwnedVector<TargetAddress> addresses(listed.adapter.GetSendTargetAddresses());
                   for (const TargetAddress* address : addresses) {
                     list.Append(NewRow(kSendtarget, kColumns, {listed.name, *address}));
                   }
                 });
  }
};

template NodePtr Make<AdapterDiscoverySendtargetList>();

}  // namespace TessaroCli::IscsiNamespace

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
constexpr auto kSendtarget = StructureOf<kColumns>("Sendtarget");

constexpr Option kOptions[] = {AdapterFilter()};

}  // namespace

class AdapterDiscoverySendtargetList : public CommandFrame<AdapterDiscoverySendtargetList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List sendtarget addresses",
      .type = kFetcher,
      .formatter = "table",
      .formatterSettings = {FieldsFrom(0, kSendtarget, "fields:Sendtarget")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetListType() const { return NewPrototype(kSendtarget); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ListAdapters(input, output, Reporting("Failed to list sendtargets."), GetListType(), NothingPassedOver,
                 [](const ListedAdapter& listed, Plinth::MetaObj::MetaList& list) {
                   const OwnedVector<TargetAddress> addresses(listed.adapter.GetSendTargetAddresses());
                   for (const TargetAddress* address : addresses) {
                     list.Append(NewRow(kSendtarget, {listed.name, *address}));
                   }
                 });
  }
};

template NodePtr Make<AdapterDiscoverySendtargetList>();

}  // namespace TessaroCli::IscsiNamespace

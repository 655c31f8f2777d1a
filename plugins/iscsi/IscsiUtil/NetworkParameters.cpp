#include "IscsiUtil/IscsiTools.h"
#include "IscsiUtil/Parameters.h"

namespace IscsiUtil {

using TessaroCli::IscsiNamespace::Column;
using TessaroCli::IscsiNamespace::NewPrototype;
using TessaroCli::IscsiNamespace::NewRow;
using TessaroCli::IscsiNamespace::Structure;
using TessaroCli::IscsiNamespace::StructureOf;

namespace {

struct Shown {
  const std::string& phynic;
  const char* option;
  int value;
  bool settable;
};

constexpr Column<Shown> kColumns[] = {
    {"Phynic", [](const Shown& shown) { return shown.phynic; }},
    {"Option", [](const Shown& shown) { return shown.option; }},
    {"Value", [](const Shown& shown) { return shown.value; }},
    {"Settable", [](const Shown& shown) { return shown.settable; }},
};

}  // namespace

constinit const Structure kNetParm = StructureOf<kColumns>("iScsiNetParm");

boost::shared_ptr<Plinth::MetaObj::MetaStruct> IscsiTools::NetParmStructure() {
  return NewPrototype(kNetParm);
}

void IscsiTools::NetParmFill(const std::string& phynic,
                             const boost::shared_ptr<Plinth::MetaObj::MetaList>& list,
                             const NodeCtl::Storage::iScsiCapabilities& capabilities, int mtu,
                             bool arpRedirect) {
  list->Append(NewRow(kNetParm, kColumns, {phynic, "MTU", mtu, capabilities.mtuSettable}));
  list->Append(NewRow(kNetParm, kColumns,
                      {phynic, "ArpRedirect", int{arpRedirect}, capabilities.arpRedirectSettable}));
}

}  // namespace IscsiUtil

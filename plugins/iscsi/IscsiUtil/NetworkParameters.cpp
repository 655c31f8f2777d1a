#include "IscsiUtil/IscsiTools.h"
#include "IscsiUtil/ParmRows.h"

namespace IscsiUtil {

using TessaroCli::Column;
using TessaroCli::NewPrototype;
using TessaroCli::NewRow;
using TessaroCli::Structure;
using TessaroCli::StructureOf;

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
constexpr auto kRow = StructureOf<kColumns>("iScsiNetParm");

}  // namespace

constinit const Structure kNetParm = static_cast<const Structure&>(kRow);  // without its columns

boost::shared_ptr<Plinth::MetaObj::MetaStruct> IscsiTools::NetParmStructure() {
  return NewPrototype(kNetParm);
}

void IscsiTools::NetParmFill(const std::string& phynic,
                             const boost::shared_ptr<Plinth::MetaObj::MetaList>& list,
                             const NodeCtl::Storage::iScsiCapabilities& capabilities, int mtu,
                             bool arpRedirect) {
  list->Append(NewRow(kRow, {phynic, "MTU", mtu, capabilities.mtuSettable}));
  list->Append(NewRow(kRow, {phynic, "ArpRedirect", int{arpRedirect}, capabilities.arpRedirectSettable}));
}

}  // namespace IscsiUtil

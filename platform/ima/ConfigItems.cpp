#include "ima/ConfigItems.h"

#include <cstring>

#include "ima/Objects.h"

namespace ima {

IMA_UINT32 ReadLoginStatus(host::Tree& tree, const IMA_OID& targetOid) {
  const auto target = host::GetTargetAlone(tree, IdOfType(targetOid, IMA_OBJECT_TYPE_TARGET));
  return Unsigned(target.object.record, "loginStatus");
}

namespace {

constexpr struct {
  IMA_UINT key;
  IMA_UINT32 (*read)(host::Tree& tree, const IMA_OID& oid);
} kItems[] = {
    {IMA_TSR_CONFIG_BOOT_TARGET, ReadBootTarget},
    {IMA_TSR_CONFIG_LOGIN_STATUS, ReadLoginStatus},
};

}  // namespace
}  // namespace ima

extern "C" IMA_STATUS IMA_TSR_GetInternalConfigData(IMA_OID oid, IMA_UINT key, void* buffer, IMA_UINT size) {
  using host::Error;
  const auto call =
      host::Call::Ima("IMA_TSR_GetInternalConfigData", ima::Id(oid), {ima::OidArgument(oid), key});
  return ima::Read(call, [&](host::Tree& tree) {
    for (const auto& item : ima::kItems) {
      if (item.key != key) continue;
      const IMA_UINT32 value = item.read(tree, oid);
      if (size != sizeof value) throw Error(Error::Kind::Invalid, "The item is of another size.");
      std::memcpy(buffer, &value, sizeof value);
      return;
    }
    throw Error(Error::Kind::NotSupported, "There is no such item.");
  });
}

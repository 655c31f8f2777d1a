/// The options of the commands that add to an adapter's lists of addresses, and remove from them.
#pragma once

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

constexpr Option ListedSendTarget() {
  return StringOption("address", 'a',
                      "The iSCSI sendtarget address: <ip/dns[:port]>. IPv6 address can be specified as "
                      "[XX:XX:XX:XX::XX]:port or XX:XX:XX:XX::XX")
      .Required();
}
constexpr Option ListedTargetName() { return TargetFilter().Required(); }
constexpr Option ListedTarget() {
  return StringOption("address", 'a',
                      "The iSCSI target address: <ip/dns[:port]>. IPv6 address can be specified as "
                      "[XX:XX:XX:XX::XX]:port or XX:XX:XX:XX::XX")
      .Required();
}

}  // namespace TessaroCli::IscsiNamespace

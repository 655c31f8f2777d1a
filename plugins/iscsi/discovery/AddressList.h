/// What the commands share that add to an adapter's lists of addresses, and remove from them.
#pragma once

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

constexpr Parameter ListedSendTarget() {
  return String("address", 'a',
                "The iSCSI sendtarget address: <ip/dns[:port]>. IPv6 address can be specified as "
                "[XX:XX:XX:XX::XX]:port or XX:XX:XX:XX::XX")
      .Required();
}
constexpr Parameter ListedTargetName() { return TargetFilter().Required(); }
constexpr Parameter ListedTarget() {
  return String("address", 'a',
                "The iSCSI target address: <ip/dns[:port]>. IPv6 address can be specified as "
                "[XX:XX:XX:XX::XX]:port or XX:XX:XX:XX::XX")
      .Required();
}

/// Changes a list of the adapter by one entry: `address`, or the static target of `name` and `address`. The
/// library's reason is shown ahead of @p failure.
template <class Entry>
void ChangeList(void (iScsiInterface::*change)(Entry), const char* failure, const InputPtr& input,
                const OutputPtr& output) {
  WithAdapter(input, output, {failure, FailureReport::Reason::First}, [&](iScsiInterface& adapter) {
    const auto address = IscsiTools::GetTargetAddressFromString(input->GetString("address"));
    if constexpr (std::is_same_v<Entry, NodeCtl::Storage::StaticTarget>) {
      (adapter.*change)({input->GetString("name"), address});
    } else {
      (adapter.*change)(address);
    }
    PostSuccess(output);
  });
}

}  // namespace TessaroCli::IscsiNamespace

/// What binding a host NIC to an adapter and unbinding it share.
#pragma once

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

constexpr Option BoundHostnic() {
  return StringOption("nic", 'n', "The iSCSI network portal (bound hostnic)").Required();
}

}  // namespace TessaroCli::IscsiNamespace

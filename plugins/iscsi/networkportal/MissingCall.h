/// Calls that an adapter with a network stack of its own may lack. It says so in exactly the words of the
/// message; of any other adapter that is a failure like all others.
#pragma once

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

inline bool LacksLnpList(iScsiInterface& adapter, const NodeCtl::Lib::NodeCtlException& failure) {
  return !adapter.IsSoftwareOrDependent() && failure.GetDescription(0) == LnpListNotSupportedMessage;
}

inline bool LacksNicProperties(iScsiInterface& adapter, const NodeCtl::Lib::NodeCtlException& failure) {
  return !adapter.IsSoftwareOrDependent() && failure.GetDescription(0) == NicPropertiesNotSupportedMessage;
}

}  // namespace TessaroCli::IscsiNamespace

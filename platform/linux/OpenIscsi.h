/// The programs of open-iscsi.
#pragma once

namespace linux {

inline constexpr const char* kIscsiadm = "/sbin/iscsiadm";

}  // namespace linux

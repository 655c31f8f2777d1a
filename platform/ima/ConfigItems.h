/// The internal configuration items of objects.
#pragma once

#include <ima/ima_tsr.h>

#include "host/Tree.h"

namespace ima {

/// Of a static target: 1 for one that the host boots from.
IMA_UINT32 ReadBootTarget(host::Tree& tree, const IMA_OID& staticTargetOid);
/// Of a target: the status word of its last login.
IMA_UINT32 ReadLoginStatus(host::Tree& tree, const IMA_OID& targetOid);

}  // namespace ima

/// Network portals of adapters, and the logical portals that they stand on: one object of the host is both.
#pragma once

#include "ima/Objects.h"

namespace ima {

/// The portal @p oid of the type @p type, network portal or logical portal.
host::Object GetPortal(host::Tree& tree, const IMA_OID& oid, IMA_OBJECT_TYPE type);

}  // namespace ima

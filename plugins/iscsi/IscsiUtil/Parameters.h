/// The shapes of the rows that show parameters.
#pragma once

#include "Declaration.h"

namespace IscsiUtil {

/// ID, Name, Current, Default, Min, Max, Settable, Inherit.
extern const TessaroCli::IscsiNamespace::Structure kParm;
/// Phynic, Option, Value, Settable.
extern const TessaroCli::IscsiNamespace::Structure kNetParm;

}  // namespace IscsiUtil

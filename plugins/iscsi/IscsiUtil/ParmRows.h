/// The shapes of the rows that show parameters.
#pragma once

#include "Rows.h"

namespace IscsiUtil {

/// ID, Name, Current, Default, Min, Max, Settable, Inherit.
extern const TessaroCli::Structure kParm;
/// Phynic, Option, Value, Settable.
extern const TessaroCli::Structure kNetParm;

}  // namespace IscsiUtil

#pragma once

#include <ima/ima.h>

#include <string>

namespace TessaroCli::Status {

/// The login status word of a target whose last login failed, with the name that RFC 7143 section 11.13.5
/// gives to it, such as "authentication failure (0x0201)".
std::string LoginStatusText(IMA_UINT32 word);

}  // namespace TessaroCli::Status

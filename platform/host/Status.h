#pragma once

#include <cstdint>

namespace host {

/// What an operation that changes something answers; the numbers are those of iScsiStatus, and others occur.
enum class Status : std::int32_t { Success = 0, RebootRequired = 1, ResetRequired = 2, NotSupported = 4 };

}  // namespace host

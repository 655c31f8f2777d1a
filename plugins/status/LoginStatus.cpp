#include "status/LoginStatus.h"

#include <ima/ima_tsr.h>

#include <cstdio>

namespace TessaroCli::Status {

namespace {

constexpr struct {
  IMA_UINT32 classAndDetail;
  const char* name;
} kNames[] = {
    {0x0101, "target moved temporarily"},
    {0x0102, "target moved permanently"},
    {0x0200, "initiator error"},
    {0x0201, "authentication failure"},
    {0x0202, "authorization failure"},
    {0x0203, "not found"},
    {0x0204, "target removed"},
    {0x0205, "unsupported version"},
    {0x0206, "too many connections"},
    {0x0207, "missing parameter"},
    {0x0208, "cannot be included in the session"},
    {0x0209, "session type not supported"},
    {0x020a, "session does not exist"},
    {0x020b, "invalid during login"},
    {0x0300, "target error"},
    {0x0301, "service unavailable"},
    {0x0302, "out of resources"},
};

}  // namespace

std::string LoginStatusText(IMA_UINT32 word) {
  const bool isResponse = word >> 16U == IMA_TSR_LOGIN_SOURCE_RESPONSE;
  std::string name = isResponse ? "refused" : "failed without a response";
  for (const auto& known : kNames) {
    if (isResponse && known.classAndDetail == (word & 0xffffU)) name = known.name;
  }
  char number[16];
  std::snprintf(number, sizeof number, isResponse ? " (0x%04x)" : " (0x%x)",
                static_cast<unsigned>(isResponse ? word & 0xffffU : word));
  return name + number;
}

}  // namespace TessaroCli::Status

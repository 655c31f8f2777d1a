#include "host/TargetSchema.h"

#include <algorithm>
#include <cstdio>

#include "host/Formats.h"
#include "host/LevelSchema.h"

namespace host {

std::string IpFault(std::string_view text) {
  if (!ParseIpv4(text) && !ParseIpv6(text)) return Excerpt(text) + " is no IP address";
  return CanonicalHostFault(text);
}

std::string TargetNameFault(std::string_view text) {
  if (text.empty() || !IsUtf8(text)) return "expected a name";
  const auto characters =
      std::count_if(text.begin(), text.end(), [](unsigned char c) { return (c & 0xc0U) != 0x80; });
  return characters <= 223 ? "" : "expected at most 223 characters";
}

std::string IsidFault(std::string_view text) {
  const bool fits = text.size() == 12 && text.find_first_not_of("0123456789abcdef") == text.npos;
  return fits ? "" : "expected twelve hexadecimal digits in lower case";
}

std::string TimeFault(std::string_view text) {
  int number = 0;
  int end = -1;
  const std::string copy(text);
  std::sscanf(copy.c_str(), "%4d-%2d-%2d %2d:%2d:%2d%n", &number, &number, &number, &number, &number, &number,
              &end);
  return end == static_cast<int>(text.size()) ? "" : "expected a time such as \"2026-11-22 14:03:22\"";
}

std::string InterfaceFault(std::string_view text) {
  return text.size() <= 32 ? "" : "expected at most 32 bytes";
}

}  // namespace host

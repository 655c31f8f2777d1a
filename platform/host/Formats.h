/// Text forms that the host and the libraries on it share: addresses and names.
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "host/Storage.h"

#pragma GCC visibility push(default)

namespace host {

using Ipv4Bytes = std::array<std::uint8_t, 4>;
using Ipv6Bytes = std::array<std::uint8_t, 16>;
using MacBytes = std::array<std::uint8_t, 6>;

/// Four decimal numbers without leading zeros.
std::optional<Ipv4Bytes> ParseIpv4(std::string_view text);
std::string FormatIpv4(const Ipv4Bytes& bytes);
/// The forms of RFC 4291 section 2.2; no zone, no prefix length, no brackets.
std::optional<Ipv6Bytes> ParseIpv6(std::string_view text);
/// The canonical form of RFC 5952.
std::string FormatIpv6(const Ipv6Bytes& bytes);
/// Six groups of two hexadecimal digits, with colons or hyphens throughout.
std::optional<MacBytes> ParseMac(std::string_view text);
std::string FormatMac(const MacBytes& bytes);
/// RFC 1123 section 2.1. A text of digits and dots alone is no name.
bool IsHostName(std::string_view text);

// Each says what is wrong with a text, and is empty for one that is right: the form of a key's check.
std::string Ipv4Fault(std::string_view text);
std::string Ipv6Fault(std::string_view text);
std::string MacFault(std::string_view text);
/// An address of either family or a name.
std::string HostFault(std::string_view text);
/// An iSCSI name (RFC 3720 section 3.2.6).
std::string IscsiNameFault(std::string_view text);
/// The same, where an empty text stands for no name.
std::string IscsiNameOrNoneFault(std::string_view text);

}  // namespace host

#pragma GCC visibility pop

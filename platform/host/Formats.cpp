#include "host/Formats.h"

#include <arpa/inet.h>

#include <algorithm>
#include <charconv>
#include <cstdio>
#include <cstring>
#include <vector>

namespace host {

namespace {

constexpr std::size_t kIscsiNameLimit = 223;
constexpr std::string_view kLowerHex = "0123456789abcdef";

bool IsDigit(char c) { return c >= '0' && c <= '9'; }
bool IsHex(char c) { return IsDigit(c) || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F'); }
bool IsLetterOrDigit(char c) { return IsDigit(c) || (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z'); }

/// The labels of a domain name: letters, digits and inner hyphens, at most 63 each.
bool AreLabels(std::string_view text) {
  for (std::size_t begin = 0;;) {
    const std::size_t end = std::min(text.find('.', begin), text.size());
    const std::string_view label = text.substr(begin, end - begin);
    if (label.empty() || label.size() > 63 || label.front() == '-' || label.back() == '-' ||
        !std::all_of(label.begin(), label.end(), [](char c) { return IsLetterOrDigit(c) || c == '-'; })) {
      return false;
    }
    if (end == text.size()) return true;
    begin = end + 1;
  }
}

std::string IqnFault(std::string_view rest) {
  const bool date = rest.size() >= 8 && rest[4] == '-' && rest[7] == '.' &&
                    std::all_of(rest.begin(), rest.begin() + 4, IsDigit) && IsDigit(rest[5]) &&
                    IsDigit(rest[6]);
  const int month = date ? (rest[5] - '0') * 10 + (rest[6] - '0') : 0;
  if (month < 1 || month > 12) return "after \"iqn.\" a year and a month must stand, as in \"iqn.2001-04.\"";
  if (!AreLabels(rest.substr(8, std::min(rest.find(':'), rest.size()) - 8))) {
    return "after the month a reversed domain name must stand, as in \"iqn.2001-04.com.example:host1\"";
  }
  return {};
}

std::string EuiFault(std::string_view digits) {
  if (digits.size() == 16 && std::all_of(digits.begin(), digits.end(), IsHex)) return {};
  return "after \"eui.\" 16 hexadecimal digits must stand";
}

/// The first digit is the type of the identifier, and each type has its length.
std::string NaaFault(std::string_view digits) {
  const char type = digits.empty() ? '\0' : digits[0];
  const std::size_t size = type == '6' ? 32 : type == '2' || type == '3' || type == '5' ? 16 : 0;
  if (size != 0 && digits.size() == size && std::all_of(digits.begin(), digits.end(), IsHex)) return {};
  return "after \"naa.\" 16 hexadecimal digits must stand, the first of them 2, 3 or 5, or 32, the first of "
         "them 6";
}

/// Of ASCII a name has letters, digits and "-", ".", ":" alone (RFC 3722).
bool IsNameCharacter(char c) {
  return static_cast<unsigned char>(c) >= 0x80 || IsLetterOrDigit(c) || c == '-' || c == '.' || c == ':';
}

}  // namespace

std::optional<Ipv4Bytes> ParseIpv4(std::string_view text) {
  // inet_pton is not used: it takes five times as long, and each of thousands of targets passes here.
  Ipv4Bytes bytes;
  const char* at = text.data();
  const char* const end = at + text.size();
  for (std::uint8_t& byte : bytes) {
    if (&byte != bytes.data() && (at == end || *at++ != '.')) return {};
    const auto [next, error] = std::from_chars(at, end, byte);
    if (error != std::errc() || (next - at > 1 && *at == '0')) return {};
    at = next;
  }
  if (at != end) return {};
  return bytes;
}

std::optional<Ipv6Bytes> ParseIpv6(std::string_view text) {
  Ipv6Bytes bytes;
  // inet_pton stops at a zero, which must not hide what stands behind it.
  if (text.find('\0') != text.npos || inet_pton(AF_INET6, std::string(text).c_str(), bytes.data()) != 1)
    return {};
  return bytes;
}

std::string FormatIpv4(const Ipv4Bytes& bytes) {
  char text[16];
  char* end = text;
  for (const std::uint8_t byte : bytes) {
    if (end != text) *end++ = '.';
    end = std::to_chars(end, std::end(text), byte).ptr;
  }
  return std::string(text, end);
}

std::string FormatIpv6(const Ipv6Bytes& bytes) {
  // inet_ntop is not used: it writes every address below ::/96 with dots, which RFC 5952 section 5
  // keeps for known prefixes.
  unsigned groups[8];
  for (std::size_t i = 0; i < 8; ++i) groups[i] = bytes[2 * i] * 256u + bytes[2 * i + 1];
  const bool mapped =
      std::all_of(groups, groups + 5, [](unsigned g) { return g == 0; }) && groups[5] == 0xffff;
  if (mapped) return "::ffff:" + FormatIpv4({bytes[12], bytes[13], bytes[14], bytes[15]});
  std::size_t begin = 8;
  std::size_t length = 1;  // a single zero group is not shortened
  for (std::size_t i = 0; i < 8; ++i) {
    std::size_t end = i;
    while (end < 8 && groups[end] == 0) ++end;
    if (end - i > length) {
      begin = i;
      length = end - i;
    }
  }
  std::string text;
  for (std::size_t i = 0; i < 8;) {
    if (i == begin) {
      text += "::";
      i += length;
      continue;
    }
    char group[8];
    std::snprintf(group, sizeof group, "%x", groups[i]);
    if (!text.empty() && text.back() != ':') text += ':';
    text += group;
    ++i;
  }
  return text;
}

std::optional<MacBytes> ParseMac(std::string_view text) {
  if (text.size() != 17 || (text[2] != ':' && text[2] != '-')) return {};
  MacBytes bytes{};
  for (std::size_t i = 0; i < 17; ++i) {
    if (i % 3 == 2) {
      if (text[i] != text[2]) return {};
      continue;
    }
    if (!IsHex(text[i])) return {};
    const auto digit = kLowerHex.find(static_cast<char>(IsDigit(text[i]) ? text[i] : text[i] | 0x20));
    bytes[i / 3] = static_cast<std::uint8_t>(bytes[i / 3] << 4 | static_cast<int>(digit));
  }
  return bytes;
}

std::string FormatMac(const MacBytes& bytes) {
  std::string text;
  for (const std::uint8_t byte : bytes) {
    if (!text.empty()) text += ':';
    text += kLowerHex[byte >> 4];
    text += kLowerHex[byte & 15];
  }
  return text;
}

bool IsHostName(std::string_view text) {
  return text.size() <= 253 && text.find_first_not_of("0123456789.") != text.npos && AreLabels(text);
}

std::string Ipv4Fault(std::string_view text) { return ParseIpv4(text) ? "" : "expected an IPv4 address"; }
std::string Ipv6Fault(std::string_view text) { return ParseIpv6(text) ? "" : "expected an IPv6 address"; }
std::string MacFault(std::string_view text) { return ParseMac(text) ? "" : "expected a MAC address"; }

std::string HostFault(std::string_view text) {
  if (ParseIpv4(text) || ParseIpv6(text) || IsHostName(text)) return {};
  return "expected an IPv4 address, an IPv6 address or a host name";
}

std::string IscsiNameFault(std::string_view text) {
  if (text.empty()) return "it is empty";
  if (text.size() > kIscsiNameLimit) {
    return "it has " + std::to_string(text.size()) + " bytes, and at most 223 are allowed";
  }
  if (!IsUtf8(text)) return "it is not UTF-8";
  const auto wrong = std::find_if_not(text.begin(), text.end(), IsNameCharacter);
  if (wrong != text.end()) {
    return "it has the character " + Quoted({&*wrong, 1}) +
           ", and of ASCII only letters, digits, \"-\", \".\" and \":\" are allowed";
  }
  if (text.starts_with("iqn.")) return IqnFault(text.substr(4));
  if (text.starts_with("eui.")) return EuiFault(text.substr(4));
  if (text.starts_with("naa.")) return NaaFault(text.substr(4));
  return "it must begin with \"iqn.\", \"eui.\" or \"naa.\"";
}

std::string IscsiNameOrNoneFault(std::string_view text) { return text.empty() ? "" : IscsiNameFault(text); }

}  // namespace host

/// Values of network configuration: addresses and their text forms.
///
/// All are plain values, copied freely, and ask no host for anything. A constructor from text throws
/// NodeCtl::Lib::NodeCtlException, with the text quoted in its message, when the text is malformed. Nothing
/// else here throws but std::bad_alloc.
#pragma once

#include <array>
#include <cstdint>
#include <iosfwd>
#include <string>
#include <vector>

#pragma GCC visibility push(default)

namespace NodeCtl::Network {

/// What kind of text a HostAddress holds. Front ends write an Ipv6 one in brackets in front of a port.
enum class AddressFamily : std::int32_t { Ipv4 = 0, Ipv6 = 1, Name = 2 };

/// An IPv4 address (RFC 791). The default is 0.0.0.0, which stands for "none".
class Ipv4Address {
 public:
  Ipv4Address() = default;
  /// Takes four decimal numbers from 0 to 255 with dots between and no leading zeros.
  explicit Ipv4Address(const std::string& text);

  /// Dotted decimal.
  std::string GetStringAddress() const;
  /// In network order.
  const std::array<std::uint8_t, 4>& GetBytes() const { return bytes_; }
  friend bool operator==(const Ipv4Address&, const Ipv4Address&) = default;

 private:
  std::array<std::uint8_t, 4> bytes_{};
};

/// An IPv6 address. The default is "::", which stands for "none".
class Ipv6Address {
 public:
  Ipv6Address() = default;
  /// Takes the forms of RFC 4291 section 2.2, without a zone and without a prefix length.
  explicit Ipv6Address(const std::string& text);

  /// The canonical form of RFC 5952.
  std::string GetStringAddress() const;
  /// In network order.
  const std::array<std::uint8_t, 16>& GetBytes() const { return bytes_; }
  friend bool operator==(const Ipv6Address&, const Ipv6Address&) = default;

 private:
  std::array<std::uint8_t, 16> bytes_{};
};

/// Where an IPv6 address comes from: set, from router advertisements (RFC 4862), or from DHCPv6. Other
/// numbers exist, mean neither of these and are shown as unknown.
enum class Ipv6AddressType : std::int32_t { Static = 0, AutoConf = 7, Dhcp = 9 };

/// An IPv6 address with the length of its prefix. The default is "::" with none, of type Static.
class Ipv6Network {
 public:
  Ipv6Network() = default;
  /// Takes a text that passes IsValidAddressAndNetmask. The type is Static.
  explicit Ipv6Network(const std::string& text);
  /// @p prefixLength is in bits, from 0 to 128; any other throws NodeCtlException.
  Ipv6Network(const Ipv6Address& address, int prefixLength, Ipv6AddressType type);

  /// The whole address, with the bits behind the prefix.
  const Ipv6Address& GetAddress() const { return address_; }
  /// The length of the prefix, in bits from 0 to 128.
  int GetNetmask() const { return prefixLength_; }
  Ipv6AddressType GetIpv6AddressType() const { return type_; }

  /// True for an IPv6 address, a slash and a decimal prefix length from 0 to 128 without leading zeros.
  static bool IsValidAddressAndNetmask(std::string text);

 private:
  Ipv6Address address_;
  int prefixLength_ = 0;
  Ipv6AddressType type_ = Ipv6AddressType::Static;
};

/// The addresses of one interface. Nothing is checked for fitting together.
class IpConfig {
 public:
  /// Whether the IPv4 address comes from DHCP.
  void SetUseDhcp(bool useDhcp) { useDhcp_ = useDhcp; }
  bool GetUseDhcp() const { return useDhcp_; }
  /// 0.0.0.0 for none, as with the netmask.
  void SetIpv4Address(const Ipv4Address& address) { ipv4Address_ = address; }
  const Ipv4Address& GetIpv4Address() const { return ipv4Address_; }
  void SetIpv4Netmask(const Ipv4Address& netmask) { ipv4Netmask_ = netmask; }
  const Ipv4Address& GetIpv4Netmask() const { return ipv4Netmask_; }
  /// Networks keep the order of the calls.
  void AddIpv6Network(const Ipv6Network& network) { ipv6Networks_.push_back(network); }
  const std::vector<Ipv6Network>& GetIpv6Network() const { return ipv6Networks_; }

 private:
  bool useDhcp_ = false;
  Ipv4Address ipv4Address_;
  Ipv4Address ipv4Netmask_;
  std::vector<Ipv6Network> ipv6Networks_;
};

/// A host by address or by name. The default is the empty host, which stands for "none".
class HostAddress {
 public:
  HostAddress() = default;
  /// Takes an IPv4 address, an IPv6 address without brackets, a host name (RFC 1123 section 2.1: letters,
  /// digits and hyphens in labels of at most 63, 253 bytes in all), or the empty text for no host.
  /// A text of digits and dots alone is an IPv4 address or malformed, never a name.
  explicit HostAddress(const std::string& text);

  /// The text; an IPv6 address in the form of RFC 5952.
  const std::string& GetStringAddress() const { return text_; }
  /// The family of the text; Name for the empty host.
  AddressFamily GetFamily() const { return family_; }
  friend bool operator==(const HostAddress&, const HostAddress&) = default;

 private:
  std::string text_;
  AddressFamily family_ = AddressFamily::Name;
};

/// Writes GetStringAddress().
std::ostream& operator<<(std::ostream& stream, const HostAddress& address);

/// An EUI-48 hardware address. The default is not valid.
class MacAddress {
 public:
  MacAddress() = default;
  /// Takes six groups of two hexadecimal digits with a colon, or throughout a hyphen, between.
  explicit MacAddress(const std::string& text);

  /// Lower-case groups with colons; "00:00:00:00:00:00" for an address that is not valid.
  std::string GetStringAddress() const;
  /// False only for a default-made address.
  bool IsValid() const { return valid_; }

 private:
  std::array<std::uint8_t, 6> bytes_{};
  bool valid_ = false;
};

}  // namespace NodeCtl::Network

#pragma GCC visibility pop

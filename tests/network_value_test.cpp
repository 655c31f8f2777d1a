#include <CoreCtl/Storage.h>
#include <NodeCtl/Exception.h>
#include <NodeCtl/Network.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cwchar>

namespace Network = NodeCtl::Network;
using NodeCtl::Lib::NodeCtlException;

namespace {

/// What each of @p forms, text and canonical form, is as a @p Value; each of @p refused is, with its text
/// named.
template <class Value>
void CheckForms(const std::map<std::string, std::string>& forms, const std::vector<std::string>& refused) {
  for (const auto& [text, form] : forms) EXPECT_EQ(Value(text).GetStringAddress(), form) << text;
  for (const std::string& text : refused) {
    try {
      ADD_FAILURE() << text << " is taken as " << Value(text).GetStringAddress();
    } catch (const NodeCtlException& error) {
      EXPECT_NE(error.GetDescription(0).find("\"" + text), std::string::npos) << error.what();
    }
  }
}

TEST(NetworkValue, Ipv4) {
  CheckForms<Network::Ipv4Address>(
      {{"0.0.0.0", "0.0.0.0"}, {"255.255.255.255", "255.255.255.255"}},
      {"10.0.0.256", "010.0.0.1", "10.0.0", "10.0.0.1.2", "10.0.0.1 ", "+1.0.0.1", "0x1.0.0.1", ""});
  EXPECT_THROW(Network::Ipv4Address(std::string("1.2.3.4\0x", 9)), NodeCtlException);
}

TEST(NetworkValue, Ipv6) {
  CheckForms<Network::Ipv6Address>({{"::", "::"},
                                    {"::1:2", "::1:2"},
                                    {"1::", "1::"},
                                    {"2001:0DB8:0:0:0:0:0:1", "2001:db8::1"},
                                    {"2001:db8:0:1:1:1:1:1", "2001:db8:0:1:1:1:1:1"},
                                    {"2001:0:0:1:0:0:0:1", "2001:0:0:1::1"},
                                    {"1:0:0:2:3:4:0:0", "1::2:3:4:0:0"},
                                    {"::ffff:192.0.2.1", "::ffff:192.0.2.1"},
                                    {"64:ff9b::192.0.2.1", "64:ff9b::c000:201"},
                                    {"1:2:3:4:5:6:7::", "1:2:3:4:5:6:7:0"}},
                                   {"1:2:3:4:5:6:7:8:9", "1::2:3:4:5:6:7:8", "1::2::3",
                                    "12345::", "fe80::1%eth0", "[::1]", "::1/64", "1:2:3:4:5:6:7", ":1", ""});
}

TEST(NetworkValue, Ipv6Network) {
  for (const char* text : {"fe80::1/64", "::/0", "::1/128"}) {
    EXPECT_TRUE(Network::Ipv6Network::IsValidAddressAndNetmask(text)) << text;
  }
  for (const char* text : {"fe80::1", "fe80::1/", "fe80::1/129", "fe80::1/064", "fe80::1/-1", "fe80::1/64 ",
                           "fe80::1/1/1", "10.0.0.1/24", "/64", "", "::/99999999999999999999"}) {
    EXPECT_FALSE(Network::Ipv6Network::IsValidAddressAndNetmask(text)) << text;
    EXPECT_THROW(Network::Ipv6Network{std::string(text)}, NodeCtlException) << text;
  }
  const Network::Ipv6Network network("2001:DB8::1/48");
  EXPECT_EQ(network.GetAddress().GetStringAddress(), "2001:db8::1");
  EXPECT_EQ(network.GetNetmask(), 48);
  EXPECT_EQ(network.GetIpv6AddressType(), Network::Ipv6AddressType::Static);
  EXPECT_THROW(Network::Ipv6Network({}, 129, Network::Ipv6AddressType::Dhcp), NodeCtlException);
  EXPECT_THROW(Network::Ipv6Network({}, -1, Network::Ipv6AddressType::Dhcp), NodeCtlException);
}

TEST(NetworkValue, HostAddress) {
  using enum Network::AddressFamily;
  CheckForms<Network::HostAddress>({{"", ""},
                                    {"10.0.0.1", "10.0.0.1"},
                                    {"FE80:0::1", "fe80::1"},
                                    {"array-1.example.com", "array-1.example.com"},
                                    {std::string(63, 'a'), std::string(63, 'a')}},
                                   {"1.2.3", "1.2.3.4.5", "999", "a_b", "-a", "a-", "a..b", "a.", "a b",
                                    "[::1]", std::string(64, 'a'), "fe80::1%0", "a" + std::string(127, '.')});
  for (const auto& [text, family] :
       {std::pair("", Name), {"10.0.0.1", Ipv4}, {"::1", Ipv6}, {"3com", Name}, {"1.2.3.x", Name}}) {
    EXPECT_EQ(Network::HostAddress(text).GetFamily(), family) << text;
  }
  std::string longest;
  while (longest.size() < 252) longest += "a.";
  EXPECT_NO_THROW(Network::HostAddress(longest + "a"));
  EXPECT_THROW(Network::HostAddress(longest + "aa"), NodeCtlException);
  EXPECT_EQ(testing::PrintToString(Network::HostAddress("0::0")), "::");
}

TEST(NetworkValue, MacAddress) {
  CheckForms<Network::MacAddress>(
      {{"00:1B:21:aa:Bb:0f", "00:1b:21:aa:bb:0f"}, {"00-1b-21-aa-bb-0f", "00:1b:21:aa:bb:0f"}},
      {"00-1b:21-aa-bb-0f", "001b21aabb0f", "00:1b:21:aa:bb", "00:1b:21:aa:bb:0g", "00:1b:21:aa:bb:0f:", ""});
  EXPECT_FALSE(Network::MacAddress().IsValid());
  EXPECT_EQ(Network::MacAddress().GetStringAddress(), "00:00:00:00:00:00");
  EXPECT_TRUE(Network::MacAddress("00:00:00:00:00:00").IsValid());
}

}  // namespace

// The tools behind the levels: target addresses as users type them, and the table of session parameters.
#include "IscsiUtil/IscsiTools.h"
#include "support/Harness.h"

namespace {

using CoreCtl::Lib::CoreCtlException;
using IscsiUtil::IscsiTools;
using NodeCtl::Storage::iScsiDigestType;
using NodeCtl::Storage::iScsiParms;
using NodeCtl::Storage::TargetAddress;

/// What @p work throws as CoreCtlException; empty when nothing.
template <class Work>
std::string RefusalOf(Work work) {
  try {
    work();
    return {};
  } catch (const CoreCtlException& refusal) {
    EXPECT_EQ(refusal.GetSourceFile(), "plugins/iscsi/IscsiUtil");
    return refusal.GetDescription(0);
  }
}

TEST(Addresses, ReadsAndShowsEachForm) {
  const struct {
    const char* text;
    const char* shown;
  } cases[] = {
      {"10.0.0.1", "10.0.0.1:3260"},
      {"10.0.0.1:3261", "10.0.0.1:3261"},
      {"storage1:860", "storage1:860"},
      {"storage1.example.org", "storage1.example.org:3260"},
      {"fe80::1", "[fe80::1]:3260"},
      {"[fe80::1]:3261", "[fe80::1]:3261"},
      {"::", "[::]:3260"},
      {"[2001:DB8:0::1]:0", "[2001:db8::1]:0"},
      {"10.0.0.1:65535", "10.0.0.1:65535"},
      {"10.0.0.1:00080", "10.0.0.1:80"},
      {"", ":3260"},
      {":1", ":1"},
      {"fe80::1:3261", "[fe80::1:3261]:3260"},  // no port: all of it is an address
  };
  for (const auto& c : cases) {
    const TargetAddress address = IscsiTools::GetTargetAddressFromString(c.text);
    EXPECT_EQ(IscsiTools::GetStringFromTargetAddress(address), c.shown) << c.text;
  }
}

TEST(Addresses, RefusesToTheLetter) {
  const struct {
    const char* text;
    const char* refusal;
  } cases[] = {
      {"[fe80::1", "Invalid address (expected format is [ipv6]:port)"},
      {"[fe80::1]", "Invalid address, expected format is [ipv6]:port)"},
      {"[fe80::1]3261", "Invalid address, expected format is [ipv6]:port)"},
      {"[zz]:3260", "Invalid IPv6 address"},
      {"[]:x", "Invalid IPv6 address"},
      {"[10.0.0.1]:3260", "Invalid IPv6 address"},
      {"[fe80::1]:", "Invalid port number"},
      {"[fe80::1]:70000", "Invalid port number"},
      {"[fe80::1]:+1", "Invalid port number"},
      {"10.0.0.1:", "Invalid port number."},
      {"10.0.0.1:-1", "Invalid port number."},
      {"10.0.0.1:65536", "Invalid port number."},
      {"10.0.0.1:12a", "Invalid port number."},
      {"10.0.0.1:99999999999999999999999", "Invalid port number."},
      {"a:b:c", "Invalid address"},
  };
  for (const auto& c : cases) {
    EXPECT_EQ(RefusalOf([&] { IscsiTools::GetTargetAddressFromString(c.text); }), c.refusal) << c.text;
  }
  // The host is tested ahead of the port, and by the library.
  EXPECT_THROW(IscsiTools::GetTargetAddressFromString("300.0.0.1:x"), NodeCtl::Lib::NodeCtlException);
}

TEST(Addresses, ValuesOfTheIpConfiguration) {
  const auto config = IscsiTools::GetIpConfigFromString("192.0.2.1", "255.255.255.0");
  EXPECT_FALSE(config.GetUseDhcp());
  EXPECT_EQ(config.GetIpv4Address(), IscsiTools::GetIpv4AddressFromString("192.0.2.1"));
  EXPECT_EQ(config.GetIpv4Netmask().GetStringAddress(), "255.255.255.0");
  EXPECT_EQ(IscsiTools::GetIpv6AddressFromString("2001:DB8::1").GetStringAddress(), "2001:db8::1");
  EXPECT_THROW(IscsiTools::GetIpConfigFromString("192.0.2.1", "x"), NodeCtl::Lib::NodeCtlException);
}

TEST(Parameters, NumbersAreWhatStrtolMakesOfThem) {
  const struct {
    const char* text;
    std::int64_t stored;
  } cases[] = {{"30", 30},
               {"12abc", 12},
               {"abc", 0},
               {"", 0},
               {" 7", 7},
               {"-1", -1},
               {"2147483647", 2147483647},
               {"4294967301", 5},
               {"99999999999999999999", -1},
               {"-99999999999999999999", 0}};
  for (const auto& c : cases) {
    iScsiParms parms;
    parms.loginTimeoutInherited = true;
    IscsiTools::ParmSet("LoginTimeout", c.text, parms);
    EXPECT_EQ(parms.loginTimeout.current, c.stored) << c.text;
    EXPECT_FALSE(parms.loginTimeoutInherited);
    // Of a wide member the high half stays.
    parms.maxBurstLength.current = 0x7'0000'0001;
    IscsiTools::ParmSet("MaxBurstLength", c.text, parms);
    EXPECT_EQ(parms.maxBurstLength.current, (0x7'0000'0000 | (c.stored & 0xffffffff))) << c.text;
  }
  iScsiParms parms;
  parms.firstBurstLength = {.current = 0x1'0000'0002, .defaultValue = 0x3'0000'0004, .min = -1};
  IscsiTools::ParmDefault("FirstBurstLength", parms);
  EXPECT_EQ(parms.firstBurstLength.current, 0x1'0000'0004);
}

TEST(Parameters, TruthIsOneOfEightWords) {
  for (const char* word : {"yes", "y", "true", "1", "no", "n", "false", "0"}) {
    const bool yes = std::string("yes y true 1").find(word) != std::string::npos;
    iScsiParms parms;
    parms.immediateData.current = !yes;
    IscsiTools::ParmSet("ImmediateData", word, parms);
    EXPECT_EQ(parms.immediateData.current, yes) << word;
  }
  for (const char* word : {"maybe", "", "Yes", "TRUE", "2", "on", "yes "}) {
    iScsiParms parms;
    parms.immediateData.current = parms.immediateDataInherited = true;
    EXPECT_EQ(RefusalOf([&] { IscsiTools::ParmSet("ImmediateData", word, parms); }),
              "Invalid data type for bool parameter expected one of [0, 1, y, n, true, false, yes, no]")
        << word;
    EXPECT_TRUE(parms.immediateData.current && parms.immediateDataInherited) << word;
  }
}

TEST(Parameters, KeysAreExact) {
  for (const char* key : {"logintimeout", "LoginTimeout ", "", "Login", "PollInterval"}) {
    iScsiParms parms;
    const std::function<void()> operations[] = {
        [&] { IscsiTools::IsParmSettable(key, parms, true, true); },
        [&] { IscsiTools::ParmSet(key, "1", parms); },
        [&] { IscsiTools::ParmInherit(key, parms); },
        [&] { IscsiTools::ParmDefault(key, parms); },
    };
    for (const auto& operation : operations) EXPECT_EQ(RefusalOf(operation), "Invalid parameter key") << key;
  }
  for (const char* key : {"HeaderDigest", "PollInterval ", "", "pollinterval"}) {
    NodeCtl::Storage::iSnsParms parms;
    const std::function<void()> operations[] = {
        [&] { IscsiTools::IsIsnsParmSettable(key, parms); },
        [&] { IscsiTools::IsnsParmSet(key, "1", parms); },
        [&] { IscsiTools::IsnsParmInherit(key, parms); },
        [&] { IscsiTools::IsnsParmDefault(key, parms); },
    };
    for (const auto& operation : operations) EXPECT_EQ(RefusalOf(operation), "Invalid parameter key") << key;
  }
}

TEST(Parameters, ADigestOutsideTheWordsIsRefused) {
  const iScsiParms parms;
  const auto list =
      Plinth::MetaObj::MetaList::New(Plinth::MetaObj::MetaType::Struct, IscsiTools::ParmStructure());
  EXPECT_EQ(RefusalOf([&] {
              IscsiTools::ParmFill("id", list, parms, iScsiDigestType::Required, iScsiDigestType{9}, true,
                                   true);
            }),
            "Invalid digest value");
}

}  // namespace

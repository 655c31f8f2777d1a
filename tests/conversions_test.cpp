// The tools behind the commands: words, addresses, wide texts, and the table of session parameters.
#include <CoreCtl/Exception.h>
#include <gtest/gtest.h>

#include <clocale>
#include <cstdlib>
#include <cstring>

#include "IscsiUtil/IscsiTools.h"

namespace {

using IscsiUtil::IscsiTools;
using namespace NodeCtl::Storage;

/// The text of the exception that @p body throws, with where it says that it comes from.
template <class Body>
std::string Refusal(Body body) {
  try {
    body();
  } catch (const CoreCtl::Lib::CoreCtlException& refusal) {
    EXPECT_EQ(refusal.GetSourceFile(), "plugins/iscsi/IscsiUtil");
    EXPECT_GT(refusal.GetLine(), 0);
    return refusal.GetDescription(0);
  }
  return "";
}

TEST(Conversions, LevelWordsGoBothWaysAndAreExact) {
  int number = 0;
  for (const std::string word : {"prohibited", "discouraged", "preferred", "required"}) {
    ++number;
    EXPECT_EQ(IscsiTools::GetStringFromDigest(iScsiDigestType(number)), word);
    EXPECT_EQ(int(IscsiTools::GetDigestFromString(word)), number);
    EXPECT_EQ(IscsiTools::GetStringFromChapType(iScsiChapType(number)), word);
    EXPECT_EQ(int(IscsiTools::GetChapTypeFromString(word)), number);
  }
  for (const int other : {-1, 0, 5}) {
    EXPECT_EQ(Refusal([&] { IscsiTools::GetStringFromDigest(iScsiDigestType(other)); }),
              "Invalid digest value");
    EXPECT_EQ(Refusal([&] { IscsiTools::GetStringFromChapType(iScsiChapType(other)); }),
              "Invalid Chap Level value");
  }
  for (const char* word : {"", "Required", "required ", "none"}) {
    EXPECT_EQ(Refusal([&] { IscsiTools::GetDigestFromString(word); }), "Invalid digest value");
    EXPECT_EQ(Refusal([&] { IscsiTools::GetChapTypeFromString(word); }), "Invalid Chap Level value");
  }
  const auto list =
      Plinth::MetaObj::MetaList::New(Plinth::MetaObj::MetaType::Struct, IscsiTools::ParmStructure());
  const auto fill = [&] {
    IscsiTools::ParmFill("id", list, {}, iScsiDigestType::Required, iScsiDigestType{9}, true, true);
  };
  EXPECT_EQ(Refusal(fill), "Invalid digest value");
  EXPECT_EQ(IscsiTools::GetStringFromImaDigest(0), "none");
  EXPECT_EQ(IscsiTools::GetStringFromImaDigest(1), "crc32c");
  EXPECT_EQ(Refusal([] { IscsiTools::GetStringFromImaDigest(2); }), "Invalid digest value");
}

TEST(Conversions, NumbersOutsideATableHaveAWord) {
  using Discovery = iScsiInterface::iScsiDiscoveryStatus;
  const struct {
    int number;
    const char *known, *compliance, *path, *discovery;
  } cases[] = {
      {0, "false", "compliant", "unused", "Discovery Completed"},
      {1, "true", "non-compliant", "standby", "Discovery Timeout"},
      {2, "unknown", "non-compliant", "active", "Discovery Completed, Some iSCSI Targets failed to login."},
      {3, "unknown", "non-compliant", "last path", "unknown"},
      {4, "unknown", "non-compliant", "unknown", "unknown"},
      {-1, "unknown", "non-compliant", "unknown", "unknown"},
  };
  for (const auto& c : cases) {
    EXPECT_EQ(IscsiTools::ConvertExtendedBoolToString(ExtendedBool(c.number)), c.known);
    EXPECT_EQ(IscsiTools::GetStringFromComplianceCode(iScsiPortErrorCodes(c.number)), c.compliance);
    EXPECT_EQ(IscsiTools::GetStringFromPathStatus(iScsiNetworkPortalStatus(c.number)), c.path);
    EXPECT_EQ(IscsiTools::GetStringFromDiscoveryStatus(Discovery(c.number)), c.discovery);
  }
}

TEST(Conversions, ImaAddressesGoBothWays) {
  const std::pair<const char*, const char*> cases[] = {
      {"192.0.2.1", "192.0.2.1"},
      {"2001:DB8:0::1", "2001:db8::1"},
      {"::ffff:192.0.2.1", "::ffff:192.0.2.1"},
  };
  for (const auto& [text, shown] : cases) {
    IMA_IP_ADDRESS* address = IscsiTools::GetImaIpAddressFromString(text);
    ASSERT_NE(address, nullptr) << text;
    EXPECT_EQ(address->ipv4Address, std::strchr(text, ':') == nullptr ? IMA_TRUE : IMA_FALSE) << text;
    EXPECT_STREQ(IscsiTools::GetStringFromImaIpAddress(address), shown);
  }
  for (const char* text : {"", "192.0.2", "fe80::1%eth0"}) {
    EXPECT_EQ(IscsiTools::GetImaIpAddressFromString(text), nullptr) << text;
  }
  // Both results live in one place each: nothing of a longer text shines through a shorter one.
  const IMA_IP_ADDRESS* first =
      IscsiTools::GetImaIpAddressFromString("2001:db8:1111:2222:3333:4444:5555:6666");
  const char* text = IscsiTools::GetStringFromImaIpAddress(first);
  EXPECT_EQ(IscsiTools::GetImaIpAddressFromString("10.0.0.1"), first);
  EXPECT_EQ(first->ipAddress[15], 0);
  EXPECT_EQ(IscsiTools::GetStringFromImaIpAddress(first), text);
  EXPECT_STREQ(text, "10.0.0.1");
  EXPECT_EQ(text[45], 0);
}

TEST(Conversions, WideTextsNeedRoomForTheTerminatorInAnyLocale) {
  for (const char* locale : {"C", "C.UTF-8"}) {
    ASSERT_NE(std::setlocale(LC_ALL, locale), nullptr);
    char buffer[8];
    const std::pair<const wchar_t*, std::string> cases[] = {
        {L"", ""},         {L"abcdefg", "abcdefg"}, {L"abcdefgh", "#"},
        {L"aäöü", "aäöü"}, {L"äöüß", "#"},          {L"\x1f600", "\xf0\x9f\x98\x80"},
    };
    for (const auto& [source, text] : cases) {
      std::memset(buffer, '#', sizeof buffer);
      const IMA_STATUS status = IscsiTools::GetUtf8StringFromWideCharString(buffer, source, sizeof buffer);
      EXPECT_EQ(status, text == "#" ? 0x80000004u : IMA_STATUS_SUCCESS);
      EXPECT_EQ(std::string(buffer, text == "#" ? 1 : std::strlen(buffer)), text);
    }
    const wchar_t outside[] = {wchar_t(0x110000), 0};
    EXPECT_EQ(IscsiTools::GetUtf8StringFromWideCharString(buffer, outside, sizeof buffer), 0x80000004u);

    wchar_t* wide = nullptr;
    ASSERT_EQ(IscsiTools::GetWideCharStringFromUtf8String(&wide, "näme"), IMA_STATUS_SUCCESS);
    EXPECT_STREQ(wide, L"näme");
    std::free(wide);
    wide = nullptr;
    EXPECT_EQ(IscsiTools::GetWideCharStringFromUtf8String(&wide, "\xff"), 0x80000004u);
    EXPECT_EQ(wide, nullptr);
  }
}

TEST(Addresses, ReadsAndShowsEachForm) {
  const std::pair<const char*, const char*> cases[] = {
      {"10.0.0.1", "10.0.0.1:3260"},
      {"storage1:860", "storage1:860"},
      {"fe80::1", "[fe80::1]:3260"},
      {"[fe80::1]:3261", "[fe80::1]:3261"},
      {"[2001:DB8:0::1]:0", "[2001:db8::1]:0"},
      {"10.0.0.1:65535", "10.0.0.1:65535"},
      {"10.0.0.1:00080", "10.0.0.1:80"},
      {"", ":3260"},
      {"fe80::1:3261", "[fe80::1:3261]:3260"},  // no port: all of it is an address
  };
  for (const auto& [text, shown] : cases) {
    const TargetAddress address = IscsiTools::GetTargetAddressFromString(text);
    EXPECT_EQ(IscsiTools::GetStringFromTargetAddress(address), shown) << text;
  }
}

TEST(Addresses, RefusesToTheLetter) {
  const std::pair<const char*, const char*> cases[] = {
      {"[fe80::1", "Invalid address (expected format is [ipv6]:port)"},
      {"[fe80::1]", "Invalid address, expected format is [ipv6]:port)"},
      {"[fe80::1]3261", "Invalid address, expected format is [ipv6]:port)"},
      {"[zz]:3260", "Invalid IPv6 address"},
      {"[10.0.0.1]:3260", "Invalid IPv6 address"},
      {"[fe80::1]:70000", "Invalid port number"},
      {"[fe80::1]:+1", "Invalid port number"},
      {"10.0.0.1:", "Invalid port number."},
      {"10.0.0.1:-1", "Invalid port number."},
      {"10.0.0.1:65536", "Invalid port number."},
      {"10.0.0.1:12a", "Invalid port number."},
      {"10.0.0.1:99999999999999999999999", "Invalid port number."},
      {"a:b:c", "Invalid address"},
  };
  for (const auto& [text, refusal] : cases) {
    EXPECT_EQ(Refusal([&, text = text] { IscsiTools::GetTargetAddressFromString(text); }), refusal) << text;
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
  const std::map<std::string, std::int64_t> cases = {{" 12abc", 12},    {"abc", 0},
                                                     {"-1", -1},        {"2147483647", 2147483647},
                                                     {"4294967301", 5}, {"99999999999999999999", -1},
                                                     {"", 0},           {"-99999999999999999999", 0}};
  for (const auto& [text, stored] : cases) {
    iScsiParms parms;
    parms.loginTimeoutInherited = true;
    IscsiTools::ParmSet("LoginTimeout", text, parms);
    EXPECT_EQ(parms.loginTimeout.current, stored) << text;
    EXPECT_FALSE(parms.loginTimeoutInherited);
    // Of a wide member the high half stays.
    parms.maxBurstLength.current = 0x7'0000'0001;
    IscsiTools::ParmSet("MaxBurstLength", text, parms);
    EXPECT_EQ(parms.maxBurstLength.current, (0x7'0000'0000 | (stored & 0xffffffff))) << text;
  }
  iScsiParms parms;
  parms.firstBurstLength = {.current = 0x1'0000'0002, .defaultValue = 0x3'0000'0004, .min = -1};
  IscsiTools::ParmDefault("FirstBurstLength", parms);
  EXPECT_EQ(parms.firstBurstLength.current, 0x1'0000'0004);
}

TEST(Parameters, TruthIsOneOfEightWords) {
  const std::map<std::string, bool> words = {{"yes", true}, {"y", true},  {"true", true},   {"1", true},
                                             {"no", false}, {"n", false}, {"false", false}, {"0", false}};
  for (const auto& [word, yes] : words) {
    iScsiParms parms;
    parms.immediateData.current = !yes;
    IscsiTools::ParmSet("ImmediateData", word, parms);
    EXPECT_EQ(parms.immediateData.current, yes) << word;
  }
  for (const char* word : {"", "Yes", "2", "yes "}) {
    iScsiParms parms;
    parms.immediateData.current = parms.immediateDataInherited = true;
    EXPECT_EQ(Refusal([&] { IscsiTools::ParmSet("ImmediateData", word, parms); }),
              "Invalid data type for bool parameter expected one of [0, 1, y, n, true, false, yes, no]")
        << word;
    EXPECT_TRUE(parms.immediateData.current && parms.immediateDataInherited) << word;
  }
}

TEST(Parameters, KeysAreExact) {
  iScsiParms parms;
  iSnsParms isns;
  for (const char* key : {"logintimeout", "pollinterval", "LoginTimeout ", "PollInterval ", ""}) {
    const std::function<void()> operations[] = {
        [&] { IscsiTools::IsParmSettable(key, parms, true, true); },
        [&] { IscsiTools::ParmSet(key, "1", parms); },
        [&] { IscsiTools::ParmInherit(key, parms); },
        [&] { IscsiTools::ParmDefault(key, parms); },
        [&] { IscsiTools::IsIsnsParmSettable(key, isns); },
        [&] { IscsiTools::IsnsParmSet(key, "1", isns); },
        [&] { IscsiTools::IsnsParmInherit(key, isns); },
        [&] { IscsiTools::IsnsParmDefault(key, isns); },
    };
    for (const auto& operation : operations) EXPECT_EQ(Refusal(operation), "Invalid parameter key") << key;
  }
}

}  // namespace

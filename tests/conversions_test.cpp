// Words, addresses and wide texts: each way, and what lies outside.
#include <CoreCtl/Exception.h>
#include <gmock/gmock.h>
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
  const char* words[] = {"prohibited", "discouraged", "preferred", "required"};
  for (int number = 1; number <= 4; ++number) {
    const std::string word = words[number - 1];
    EXPECT_EQ(IscsiTools::GetStringFromDigest(iScsiDigestType(number)), word);
    EXPECT_EQ(int(IscsiTools::GetDigestFromString(word)), number);
    EXPECT_EQ(IscsiTools::GetStringFromChapType(iScsiChapType(number)), word);
    EXPECT_EQ(int(IscsiTools::GetChapTypeFromString(word)), number);
  }
  for (const int number : {-1, 0, 5, 1 << 30}) {
    EXPECT_EQ(Refusal([&] { IscsiTools::GetStringFromDigest(iScsiDigestType(number)); }),
              "Invalid digest value");
    EXPECT_EQ(Refusal([&] { IscsiTools::GetStringFromChapType(iScsiChapType(number)); }),
              "Invalid Chap Level value");
  }
  for (const char* word : {"", "Required", "required ", "none"}) {
    EXPECT_EQ(Refusal([&] { IscsiTools::GetDigestFromString(word); }), "Invalid digest value");
    EXPECT_EQ(Refusal([&] { IscsiTools::GetChapTypeFromString(word); }), "Invalid Chap Level value");
  }
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
  const struct {
    const char* text;
    bool ipv4;
    const char* shown;
  } cases[] = {
      {"192.0.2.1", true, "192.0.2.1"},
      {"2001:DB8:0::1", false, "2001:db8::1"},
      {"2001:db8:1111:2222:3333:4444:5555:6666", false, "2001:db8:1111:2222:3333:4444:5555:6666"},
      {"::ffff:192.0.2.1", false, "::ffff:192.0.2.1"},
  };
  for (const auto& c : cases) {
    const IMA_IP_ADDRESS* address = IscsiTools::GetImaIpAddressFromString(c.text);
    ASSERT_NE(address, nullptr) << c.text;
    EXPECT_EQ(address->ipv4Address, c.ipv4 ? IMA_TRUE : IMA_FALSE) << c.text;
    EXPECT_STREQ(IscsiTools::GetStringFromImaIpAddress(address), c.shown);
  }
  for (const char* text : {"", "not an address", "192.0.2", "192.0.2.1 ", "fe80::1%eth0"}) {
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
    const struct {
      const wchar_t* source;
      const char* text;  // null for a refusal
    } cases[] = {
        {L"", ""},       {L"abcdefg", "abcdefg"}, {L"abcdefgh", nullptr}, {L"abcdefghi", nullptr},
        {L"äöü", "äöü"}, {L"aäöü", "aäöü"},       {L"äöüß", nullptr},     {L"\x1f600", "\xf0\x9f\x98\x80"},
    };
    for (const auto& c : cases) {
      std::memset(buffer, '#', sizeof buffer);
      const IMA_STATUS status = IscsiTools::GetUtf8StringFromWideCharString(buffer, c.source, sizeof buffer);
      if (c.text != nullptr) {
        EXPECT_EQ(status, IMA_STATUS_SUCCESS);
        EXPECT_STREQ(buffer, c.text);
      } else {
        EXPECT_EQ(status, 0x80000004u);
        EXPECT_EQ(buffer[0], '#');
      }
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

}  // namespace

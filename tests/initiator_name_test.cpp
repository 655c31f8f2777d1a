#include <CoreCtl/Storage.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

#include "support/Harness.h"

using CoreCtl::Storage::iScsiUtil;
using NodeCtl::Lib::NodeCtlException;
using testing::HasSubstr;

namespace {

/// What the name is refused for, or an empty text.
std::string Fault(const std::string& name) {
  try {
    EXPECT_TRUE(iScsiUtil::CheckInitiatorName(name));
    return {};
  } catch (const NodeCtlException& error) {
    return error.GetDescription(0);
  }
}

TEST(InitiatorName, Rules) {
  const Harness host("{}");
  const std::string stem = "iqn.2001-04.com.example:";
  for (const std::string& name :
       std::vector<std::string>{"iqn.2001-04.com.example", stem + "host1", stem + "a:b-c.D", stem + "\u00fc",
                                stem, stem + std::string(223 - stem.size(), 'x'), "eui.02004567A425678D",
                                "naa.52004567ba64678d", "naa.62004567BA64678D0123456789ABCDEF"}) {
    EXPECT_EQ(Fault(name), "") << name;
  }
  const struct {
    std::string name;
    std::string fault;
  } refused[] = {
      {"", "empty"},
      {"IQN.2001-04.com.example", "must begin with"},
      {"iqn.", "a year and a month"},
      {"iqn.2001-00.com.example", "a year and a month"},
      {"iqn.2001-13.com.example", "a year and a month"},
      {"iqn.2001-4.com.example", "a year and a month"},
      {"iqn.2001-04com.example", "a year and a month"},
      {"iqn.2001-04.", "domain name"},
      {"iqn.2001-04.com..example", "domain name"},
      {"iqn.2001-04.com.-example", "domain name"},
      {stem + "a_b", "the character \"_\""},
      {stem + "a\n", "the character \"\\n\""},
      {stem + "\xff", "UTF-8"},
      {stem + std::string(224 - stem.size(), 'x'), "224 bytes"},
      {"eui.02004567A425678", "16 hexadecimal"},
      {"eui.02004567A425678D0123456789ABCDEF", "16 hexadecimal"},
      {"eui.02004567A425678G", "16 hexadecimal"},
      {"naa.", "16 hexadecimal"},
      {"naa.52004567ba64678", "16 hexadecimal"},
      {"naa.52004567BA64678D0123456789ABCDEF", "the first of them 6"},
      {"naa.62004567ba64678d", "the first of them 6"},
      {"naa.42004567ba64678d", "2, 3 or 5"},
  };
  for (const auto& c : refused) {
    EXPECT_THAT(Fault(c.name), HasSubstr(c.fault)) << c.name;
  }
}

TEST(ConvertHostAddress, RefusesWhatNamesNoHost) {
  const Harness host("{}");
  for (const std::wstring& name : {std::wstring(), std::wstring(L"a b"),
                                   std::wstring(1, static_cast<wchar_t>(0xd800)), std::wstring(256, L'a')}) {
    IMA_HOST_ID id{};
    id.hostnameInUse = IMA_TRUE;
    std::copy(name.begin(), name.end(), id.id.hostname);
    EXPECT_THROW(iScsiUtil::ConvertHostAddress(id), NodeCtlException);
  }
}

}  // namespace

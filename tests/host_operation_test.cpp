// Operations at the choke point: trace, answers, adapters, and the memory and texts of the management API.
#include <CoreCtl/Storage.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <text/text.h>

#include <cstring>
#include <fstream>
#include <memory>
#include <new>
#include <utility>

#include "host/Host.h"
#include "ima/Memory.h"
#include "ima/Operation.h"
#include "simulator/Simulator.h"
#include "support/Harness.h"

using CoreCtl::Storage::iScsiInterfaceImpl;
using CoreCtl::Storage::StorageInfoImpl;
using NodeCtl::Lib::NodeCtlException;
using NodeCtl::Storage::iScsiInterface;
using NodeCtl::Storage::ScsiInterface;
using testing::ElementsAre;

namespace {

constexpr const char* kAdapters = R"("adapters": [
    {"name": "hba0", "kind": "dependent", "state": 7, "capabilities": {"Name And Alias Settable": true}},
    {"name": "hba1", "capabilities": {"IPv6 Supported": true}},
    {"name": "disk0", "kind": "scsi", "uid": "u", "driver": "d"}])";

std::string With(const std::string& more) { return "{" + std::string(kAdapters) + ", " + more + "}"; }

std::unique_ptr<iScsiInterface> Adapter(const std::string& name) {
  return std::unique_ptr<iScsiInterface>(
      dynamic_cast<iScsiInterfaceImpl*>(StorageInfoImpl().GetScsiInterface(name)));
}

TEST(HostOperation, TheTraceTellsEachCallAndItsOutcome) {
  const Harness host(With(
      R"("answers": [{"operation": "GetCapabilities", "throw": "NodeCtlException", "text": "no\nway"}])"));
  const auto adapter = Adapter("hba0");
  adapter->SetInitiatorAlias("a \"b\"\x01");
  adapter->GetInitiatorAlias();
  adapter->IsSoftwareOrDependent();
  adapter->GetPhysicalHbaProperties();
  EXPECT_THROW(adapter->GetCapabilities(), NodeCtlException);
  StorageInfoImpl().GetScsiInterface("n\xff\u009b\u00e9");
  StorageInfoImpl().EnableSoftwareiScsi(false);
  EXPECT_EQ(host::Host::Current().Change(
                host::Call::OnAdapter("SetMtu", "hba0", {host::Argument::Secret(), 9000, true}),
                [](host::Tree&) { return host::Status::ResetRequired; }),
            host::Status::ResetRequired);
  EXPECT_THAT(host.trace,
              ElementsAre("GetScsiInterface(\"hba0\") = ok", R"(SetInitiatorAlias(hba0, "a \"b\"\x01") = 0)",
                          R"(GetInitiatorAlias(hba0) = "a \"b\"\x01")", "IsSoftwareOrDependent(hba0) = true",
                          "GetPhysicalHbaProperties(hba0) = ok",
                          R"(GetCapabilities(hba0) ! NodeCtlException: no\nway)",
                          "GetScsiInterface(\"n\\xff\\xc2\\x9b\u00e9\") = null",
                          "EnableSoftwareiScsi(false) = ok", "SetMtu(hba0, ***, 9000, true) = 2"));
}

TEST(HostOperation, Adapters) {
  const Harness host(With(R"("softwareIscsi": {"enabled": true})"));
  const std::unique_ptr<ScsiInterface> disk(StorageInfoImpl().GetScsiInterface("disk0"));
  EXPECT_EQ(dynamic_cast<iScsiInterfaceImpl*>(disk.get()), nullptr);
  EXPECT_EQ(disk->GetName() + disk->GetAdapterUid() + disk->GetDriverName(), "disk0ud");
  EXPECT_THROW(Adapter("hba1")->SetInitiatorAlias("x"), NodeCtlException);  // not settable there
  const auto adapter = Adapter("hba0");
  EXPECT_THROW(adapter->SetInitiatorAlias(std::string(256, 'x')), NodeCtlException);
  EXPECT_THROW(adapter->SetInitiatorAlias("\xff"), NodeCtlException);
  EXPECT_NO_THROW(adapter->SetInitiatorAlias(std::string(255, 'x')));
  simulator::Load("{}");
  EXPECT_THROW(adapter->GetName(), NodeCtlException);  // gone since
}

TEST(HostOperation, TheSoftwareAdapterComesAndGoesWithTheInitiator) {
  const TemporaryRoot root;
  std::filesystem::create_directories(root.Path() + "/etc/tessaro/coreiscsid");
  std::ofstream(root.Path() + "/etc/tessaro/coreiscsid/initiatorname.iscsi")
      << "InitiatorName='iqn.2001-04.com.example:it'\n";
  const Harness host(With(R"("softwareIscsi": {"enabled": false})"));
  StorageInfoImpl().EnableSoftwareiScsi(false);
  EXPECT_EQ(Adapter("hba2")->GetInitiatorName(), "iqn.2001-04.com.example:it");
  EXPECT_EQ(Adapter("hba2")->GetDriverName(), "tsriscsi_sw");
  auto description = host.Show();
  EXPECT_EQ(description["adapters"].size(), 4u);
  description["softwareIscsi"] = {{"enabled", false}};
  simulator::Load(description.dump());
  EXPECT_EQ(Adapter("hba2"), nullptr);
}

TEST(Ima, CallsGiveTheirFailuresAsStatus) {
  const Harness host("{}");
  IMA_LHBA_PROPERTIES properties;
  const auto call = [&](std::int64_t id) {
    return IMA_GetLhbaProperties(ima::Oid(IMA_OBJECT_TYPE_LHBA, id), &properties);
  };
  EXPECT_EQ(call(host::kRoot), IMA_ERROR_INCORRECT_OBJECT_TYPE);
  EXPECT_EQ(call(999), IMA_ERROR_OBJECT_NOT_FOUND);
  EXPECT_EQ(host.trace.back(), "IMA_GetLhbaProperties(lhba 999) = 0x80000007: The adapter is gone.");
  EXPECT_EQ(ima::StatusOf([] { throw std::bad_alloc(); }), IMA_ERROR_INSUFFICIENT_MEMORY);
}

TEST(Ima, APhysicalAdapterIsOneOfIscsi) {
  const Harness host(With(R"("nics": [])"));  // one adapter is of another kind
  IMA_OID_LIST* list = nullptr;
  ASSERT_EQ(IMA_GetPhbaOidList(&list), IMA_STATUS_SUCCESS);
  EXPECT_EQ(list->oidCount, 2u);
  IMA_FreeMemory(list);
}

TEST(Ima, MemoryIsTakenBackOnce) {
  const std::size_t before = ima::OutstandingAllocations();
  auto owned = ima::OidList(IMA_OBJECT_TYPE_TARGET, {5, 6, 7});
  EXPECT_EQ(ima::OutstandingAllocations(), before + 1);
  IMA_OID_LIST* list = owned.release();
  EXPECT_EQ(IMA_FreeMemory(&list->oids[1]), IMA_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(IMA_FreeMemory(list), IMA_STATUS_SUCCESS);
  EXPECT_EQ(IMA_FreeMemory(list), IMA_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(IMA_FreeMemory(nullptr), IMA_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(ima::OutstandingAllocations(), before);
}

TEST(TextHelpers, CharacterSets) {
  // The least and the greatest of each length, and those beside the surrogates.
  const char narrow[] =
      "\x01\x7f\xc2\x80\xdf\xbf\xe0\xa0\x80\xed\x9f\xbf\xee\x80\x80\xef\xbf\xbf\xf0\x90\x80\x80"
      "\xf4\x8f\xbf\xbf";
  const wchar_t wide[] = L"\x01\x7f\x80\x7ff\x800\xd7ff\xe000\xffff\x10000\x10ffff";
  wchar_t* toWide = nullptr;
  char* toNarrow = nullptr;
  ASSERT_TRUE(CodeSet_UTF8ToUTF32(narrow, &toWide));
  ASSERT_TRUE(CodeSet_UTF32ToUTF8(wide, &toNarrow));
  EXPECT_STREQ(toWide, wide);
  EXPECT_STREQ(toNarrow, narrow);
  std::free(std::exchange(toWide, nullptr));
  std::free(std::exchange(toNarrow, nullptr));
  for (const char* malformed : {"\x80", "\xc0\x80", "\xc3", "\xc3(", "\xe0\x9f\xbf", "\xed\xa0\x80",
                                "\xf0\x8f\xbf\xbf", "\xf4\x90\x80\x80", "\xf5\x80\x80\x80", "ok\xff"}) {
    EXPECT_FALSE(CodeSet_UTF8ToUTF32(malformed, &toWide)) << malformed;
  }
  for (const int malformed : {0xd800, 0xdfff, 0x110000, -1}) {
    const wchar_t text[] = {L'a', static_cast<wchar_t>(malformed), 0};
    EXPECT_FALSE(CodeSet_UTF32ToUTF8(text, &toNarrow)) << malformed;
  }
  EXPECT_TRUE(toWide == nullptr && toNarrow == nullptr);
}

TEST(TextHelpers, Append) {
  char buffer[8] = "abc";
  EXPECT_EQ(Str_Strcat(buffer, "de", sizeof buffer), buffer);
  EXPECT_STREQ(buffer, "abcde");
  EXPECT_STREQ(Str_Strcat(buffer, "fghij", sizeof buffer), "abcdefg");
  EXPECT_STREQ(Str_Strcat(buffer, "x", sizeof buffer), "abcdefg");
  EXPECT_STREQ(Str_Strcat(buffer, "x", 4), "abcdefg");  // full without a terminator: left alone
}

}  // namespace

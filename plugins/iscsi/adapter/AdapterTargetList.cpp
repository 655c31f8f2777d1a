#include <text/text.h>

#include <cstdio>

#include "ImaWalk.h"

namespace TessaroCli::IscsiNamespace {
namespace {

struct Listed {
  const ImaWalk::Target& target;
  std::string lastError;
};

std::string DiscoveryMethodText(IMA_UINT32 flags) {
  static constexpr struct {
    IMA_UINT32 flag;
    const char* word;
  } kMethods[] = {
      {IMA_TARGET_DISCOVERY_METHOD_STATIC, "STATIC "},
      {IMA_TARGET_DISCOVERY_METHOD_SLP, "SLP "},
      {IMA_TARGET_DISCOVERY_METHOD_ISNS, "ISNS "},
      {IMA_TARGET_DISCOVERY_METHOD_SENDTARGETS, "SENDTARGETS "},
  };
  char text[kTextSize] = "";
  for (const auto& method : kMethods) {
    if (flags & method.flag) Str_Strcat(text, method.word, sizeof text);
  }
  return text;
}

constexpr Column<Listed> kColumns[] = {
    {"ID", [](const Listed& listed) { return listed.target.Id(); }},
    {"Adapter", [](const Listed& listed) { return listed.target.adapter.name; }},
    {"Target", [](const Listed& listed) { return listed.target.name; }},
    {"Alias", [](const Listed& listed) { return NarrowText(listed.target.properties.alias, kTextSize); }},
    {"Discovery Method",
     [](const Listed& listed) { return DiscoveryMethodText(listed.target.properties.discoveryMethodFlags); }},
    {"SendTargets Discovery Settable",
     [](const Listed& listed) { return listed.target.properties.sendTargetsDiscoverySettable != 0; }},
    {"SendTargets Discovery Enabled",
     [](const Listed& listed) { return listed.target.properties.sendTargetsDiscoveryEnabled != 0; }},
    {"Last Error", [](const Listed& listed) { return listed.lastError; }},
};
constexpr auto kTarget = StructureOf<kColumns>("Target");

constexpr Option kOptions[] = {
    AdapterFilter(),
    TargetFilter(),
};

/// Status-Class and Status-Detail of a login response: RFC 7143 section 11.13.5.
constexpr struct {
  IMA_UINT32 classAndDetail;
  const char* text;
} kLoginStatuses[] = {
    {0x0000, "0x0000 Login is proceeding okay."},
    {0x0101, "0x0101 Requested ITN has moved temporarily to the address provided."},
    {0x0102, "0x0102 Requested ITN has moved permanently to the address provided."},
    {0x0200, "0x0200 Miscellaneous iSCSI initiator errors."},
    {0x0201, "0x0201 Initiator could not be successfully authenticated."},
    {0x0202, "0x0202 Initiator is not allowed access to the given target."},
    {0x0203, "0x0203 Requested ITN does not exist at this address."},
    {0x0204, "0x0204 Requested ITN has been removed and no forwarding address is provided."},
    {0x0205, "0x0205 Requested iSCSI version range is not supported by the target."},
    {0x0206, "0x0206 No more connections can be accepted on this Session ID (SSID)."},
    {0x0207, "0x0207 Missing parameters (e.g., iSCSI initiator and/or target name)."},
    {0x0208, "0x0208 Target does not support session spanning to this connection (address)."},
    {0x0209, "0x0209 Target does not support this type of session or not from this initiator."},
    {0x020a, "0x020A Attempt to add a connection to a nonexistent session."},
    {0x020b, "0x020B Invalid request type during login."},
    {0x0300, "0x0300 Target hardware or software error."},
    {0x0301, "0x0301 iSCSI service or target is not currently operational."},
    {0x0302, "0x0302 Target has insufficient session, connection or other resources."},
};

}  // namespace

class AdapterTargetList : public CommandFrame<AdapterTargetList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List iSCSI targets.",
      .type = kFetcher,
      .formatter = "table",
      .formatterSettings = {Setting("header:Target", "%ID%"),
                            Setting("fields:Target", "Adapter,Target,Alias,Discovery Method,Last Error")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetListType() const { return NewPrototype(kTarget); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    PostImaList(output, GetListType(), [&](auto& list) {
      ImaWalk(input).Targets([&](const ImaWalk::Target& target) {
        list.Append(NewRow(kTarget, {target, LastError(target.oid)}));
      });
    });
  }

  static std::string LastError(const IMA_OID& target) {
    IMA_UINT32 word = 0;
    const IMA_STATUS status =
        IMA_TSR_GetInternalConfigData(target, IMA_TSR_CONFIG_LOGIN_STATUS, &word, sizeof word);
    return status == IMA_STATUS_SUCCESS ? getErrorString(word) : "na";
  }

  static std::string getErrorString(IMA_UINT32 word) {
    const IMA_UINT32 source = word >> 16;
    if (source == IMA_TSR_LOGIN_SOURCE_NONE) return "No Error";
    if (source == IMA_TSR_LOGIN_SOURCE_RESPONSE) {
      for (const auto& status : kLoginStatuses) {
        if (status.classAndDetail == (word & 0xffff)) return status.text;
      }
    }
    char text[255];
    std::snprintf(text, sizeof text, "Unqualified Login Status. (Error=0x%x)", word);
    return text;
  }
};

template NodePtr Make<AdapterTargetList>();

}  // namespace TessaroCli::IscsiNamespace

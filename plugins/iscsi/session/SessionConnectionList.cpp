#include <cstdlib>
#include <ctime>
#include <iterator>

#include "ImaWalk.h"
#include "IscsiUtil/Refusal.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using Properties = IMA_CONNECTION_PROPERTIES;
using Status = IMA_TSR_CONNECTION_STATUS;

struct Listed {
  const ImaWalk::Session& session;
  const Properties& properties;
  const Status& status;
};

constexpr char kNotAvailable[] = "Not Available";

constexpr const char* kStates[] = {"free",      "xpt_wait",  "xpt_up",           "in_login",
                                   "logged_in", "in_logout", "logout_requested", "cleanup_wait"};

std::string TimeText(const IMA_DATETIME& time) {
  char text[64];
  return std::strftime(text, sizeof text, "%D %T", &time) == 0 ? kNotAvailable : text;
}

template <auto present, auto address>
constexpr auto Address = [](const Listed& listed) -> std::string {
  return listed.status.*present == 1 ? AddressText(listed.status.*address) : kNotAvailable;
};
template <auto present, auto time>
constexpr auto Time = [](const Listed& listed) -> std::string {
  return listed.status.*present == 1 ? TimeText(listed.status.*time) : kNotAvailable;
};

}  // namespace

class SessionConnectionList : public CommandFrame<SessionConnectionList> {
  /// In upper case, unlike the shared conversion.
  static const char* GetStringFromImaDigest(IMA_DIGEST_TYPE digest) {
    if (digest == IMA_DIGEST_NONE) return "NONE";
    if (digest == IMA_DIGEST_CRC32C) return "CRC32C";
    IscsiUtil::Refuse("Invalid digest value", "plugins/iscsi/session/SessionConnectionList");
  }

  static constexpr Column<Listed> kColumns[] = {
      {"ID",
       [](const Listed& listed) {
         return CutText(listed.session.Id() + ',' + std::to_string(listed.properties.connectionId),
                        kTextSize);
       }},
      {"Adapter", [](const Listed& listed) { return listed.session.target.adapter.name; }},
      {"Target", [](const Listed& listed) { return listed.session.target.name; }},
      {"ISID", [](const Listed& listed) { return listed.session.isid; }},
      {"CID", Property<&Properties::connectionId>},
      {"DataDigest",
       [](const Listed& listed) { return GetStringFromImaDigest(listed.properties.dataDigest); }},
      {"HeaderDigest",
       [](const Listed& listed) { return GetStringFromImaDigest(listed.properties.headerDigest); }},
      {"IFMarker", IsSet<&Properties::ifMarker>},
      {"IFMarkerInterval", Property<&Properties::ifMarkerInterval>},
      {"MaxRecvDataSegmentLength", Property<&Properties::maxRecvDataSegmentLength>},
      {"MaxTransmitDataSegmentLength", Property<&Properties::maxTransmitDataSegmentLength>},
      {"OFMarker", IsSet<&Properties::ofMarker>},
      {"OFMarkerInterval", Property<&Properties::ofMarkerInterval>},
      {"ConnectionAddress", Address<&Status::connectionAddressPresent, &Status::connectionAddress>},
      {"RemoteAddress", Address<&Status::remoteAddressPresent, &Status::remoteAddress>},
      {"LocalAddress", Address<&Status::localAddressPresent, &Status::localAddress>},
      {"SessionCreateTime", Time<&Status::sessionCreateTimePresent, &Status::sessionCreateTime>},
      {"ConnectionCreateTime", Time<&Status::connectionCreateTimePresent, &Status::connectionCreateTime>},
      {"ConnectionStartTime", Time<&Status::connectionStartTimePresent, &Status::connectionStartTime>},
      {"State",
       [](const Listed& listed) {
         return listed.status.state < std::size(kStates) ? kStates[listed.status.state] : "unknown";
       }},
  };
  static constexpr auto kConnection = StructureOf<kColumns>("Connection");

  static constexpr Option kOptions[] = {
      AdapterFilter(),
      TargetFilter(),
      StringOption("isid", 's', "The iSCSI session identifier(ISID)."),
      StringOption("cid", 'c', "The iSCSI connection identifier(CID)."),
  };

  static constexpr SessionTexts kTexts{
      .list = "Unable to get session list.",
      .properties = "Unable to get logical adapter properties.",
  };

 public:
  static constexpr Declaration kDeclaration{
      .description = "List iSCSI connections.",
      .type = kFetcher,
      .formatter = "simple",
      .formatterSettings =
          {Setting("header:Connection", "%ID%"),
           Setting("fields:Connection",
                   "Adapter,Target,ISID,CID,DataDigest,HeaderDigest,IFMarker,IFMarkerInterval,"
                   "MaxRecvDataSegmentLength,MaxTransmitDataSegmentLength,OFMarker,OFMarkerInterval,"
                   "ConnectionAddress,RemoteAddress,LocalAddress,SessionCreateTime,ConnectionCreateTime,"
                   "ConnectionStartTime,State")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetListType() const { return NewPrototype(kConnection); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    PostImaList(output, GetListType(), [&](auto& list) {
      ImaWalk(input).Sessions(kTexts, [&](const ImaWalk::Session& session) {
        for (const IMA_OID& oid :
             ImaList("Unable to get connection list.", IMA_GetConnectionOidList, session.oid)) {
          const auto properties =
              ReadIma(IMA_GetConnectionProperties, oid, "Unable to get connection properties.");
          if (!IsWanted(*input, properties.connectionId)) continue;
          const auto status = ReadIma(IMA_TSR_GetConnectionStatus, oid, "Unable to get connection status.");
          list.Append(NewRow(kConnection, {session, properties, status}));
        }
      });
    });
  }

  /// Whether the option `cid`, where it was given, names the connection. A text without a number in it is 0.
  static bool IsWanted(const Plinth::CallSpec::Input& input, IMA_UINT16 cid) {
    return !input.HasParameter("cid") || std::strtol(input.GetString("cid").c_str(), nullptr, 10) == cid;
  }
};

template NodePtr Make<SessionConnectionList>();

}  // namespace TessaroCli::IscsiNamespace

#include "ImaWalk.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using Session = ImaWalk::Session;

const char* AuthenticationText(IMA_AUTHMETHOD method) {
  switch (method) {
    case IMA_AUTHMETHOD_NONE:
      return "none";
    case IMA_AUTHMETHOD_CHAP:
      return "chap";
    default:
      return "unsupported";
  }
}

/// RFC 7143 section 13.14: the length says nothing where the initiator may send no unsolicited data.
std::string FirstBurstLengthText(const IMA_SESSION_PROPERTIES& properties) {
  if (!properties.immediateData && properties.initialR2T) return "Irrelevant";
  return std::to_string(static_cast<int>(properties.firstBurstLength));
}

using Properties = IMA_SESSION_PROPERTIES;

constexpr Column<Session> kColumns[] = {
    {"ID", [](const Session& session) { return session.Id(); }},
    {"Adapter", [](const Session& session) { return session.target.adapter.name; }},
    {"Target", [](const Session& session) { return session.target.name; }},
    {"AuthenticationMethod",
     [](const Session& session) { return AuthenticationText(session.properties.authMethod); }},
    {"DataPduInOrder", Is<&Properties::dataPduInOrder>},
    {"DataSequenceInOrder", Is<&Properties::dataSequenceInOrder>},
    {"DefaultTime2Retain", Number<&Properties::defaultTime2Retain>},
    {"DefaultTime2Wait", Number<&Properties::defaultTime2Wait>},
    {"ErrorRecoveryLevel", Number<&Properties::errorRecoveryLevel>},
    {"FirstBurstLength", [](const Session& session) { return FirstBurstLengthText(session.properties); }},
    {"ImmediateData", Is<&Properties::immediateData>},
    {"InitialR2T", Is<&Properties::initialR2T>},
    {"ISID", [](const Session& session) { return session.isid; }},
    {"MaxBurstLength", Number<&Properties::maxBurstLength>},
    {"MaxConnections", Number<&Properties::maxConnections>},
    {"MaxOutstandingR2T", Number<&Properties::maxOutstandingR2T>},
    {"TargetPortalGroupTag", Number<&Properties::targetPortalGroupTag>},
    {"TSIH", Number<&Properties::tsih>},
};
constexpr Structure kSession = StructureOf<kColumns>("Session");

constexpr Parameter kParameters[] = {
    AdapterFilter(),
    TargetFilter(),
    String("isid", 's', "The iSCSI session identifier."),
};

constexpr WalkTexts kTexts{
    .sessionList = "Unable to get target list.",
    .sessionProperties = "Feature not supported by this adapters.",
};

}  // namespace

class SessionList : public CommandFrame<SessionList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List iSCSI Sessions.",
      .type = kFetcher,
      .formatter = "simple",
      .formatterParameters =
          {Setting("header:Session", "%ID%"),
           Setting(
               "fields:Session",
               "Adapter,Target,ISID,TargetPortalGroupTag,AuthenticationMethod,DataPduInOrder,"
               "DataSequenceInOrder,DefaultTime2Retain,DefaultTime2Wait,ErrorRecoveryLevel,FirstBurstLength,"
               "ImmediateData,InitialR2T,MaxBurstLength,MaxConnections,MaxOutstandingR2T,TSIH")},
      .parameters = kParameters,
      .result = ListOf(kSession),
  };

  StructPtr GetListType() const { return NewPrototype(kSession); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    PostImaList(output, kSession, [&](auto& list) {
      ImaWalk(input, kTexts).Sessions([&](const Session& session) {
        list.Append(NewRow(kSession, kColumns, session));
      });
    });
  }
};

template NodePtr Make<SessionList>();

}  // namespace TessaroCli::IscsiNamespace

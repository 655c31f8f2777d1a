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
    {"DataPduInOrder", IsSet<&Properties::dataPduInOrder>},
    {"DataSequenceInOrder", IsSet<&Properties::dataSequenceInOrder>},
    {"DefaultTime2Retain", Property<&Properties::defaultTime2Retain>},
    {"DefaultTime2Wait", Property<&Properties::defaultTime2Wait>},
    {"ErrorRecoveryLevel", Property<&Properties::errorRecoveryLevel>},
    {"FirstBurstLength", [](const Session& session) { return FirstBurstLengthText(session.properties); }},
    {"ImmediateData", IsSet<&Properties::immediateData>},
    {"InitialR2T", IsSet<&Properties::initialR2T>},
    {"ISID", [](const Session& session) { return session.isid; }},
    {"MaxBurstLength", Property<&Properties::maxBurstLength>},
    {"MaxConnections", Property<&Properties::maxConnections>},
    {"MaxOutstandingR2T", Property<&Properties::maxOutstandingR2T>},
    {"TargetPortalGroupTag", Property<&Properties::targetPortalGroupTag>},
    {"TSIH", Property<&Properties::tsih>},
};
constexpr auto kSession = StructureOf<kColumns>("Session");

constexpr Option kOptions[] = {
    AdapterFilter(),
    TargetFilter(),
    StringOption("isid", 's', "The iSCSI session identifier."),
};

constexpr SessionTexts kTexts{
    .list = "Unable to get target list.",
    .properties = "Feature not supported by this adapters.",
};

}  // namespace

class SessionList : public CommandFrame<SessionList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List iSCSI Sessions.",
      .type = kFetcher,
      .formatter = "simple",
      .formatterSettings =
          {Setting("header:Session", "%ID%"),
           Setting(
               "fields:Session",
               "Adapter,Target,ISID,TargetPortalGroupTag,AuthenticationMethod,DataPduInOrder,"
               "DataSequenceInOrder,DefaultTime2Retain,DefaultTime2Wait,ErrorRecoveryLevel,FirstBurstLength,"
               "ImmediateData,InitialR2T,MaxBurstLength,MaxConnections,MaxOutstandingR2T,TSIH")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetListType() const { return NewPrototype(kSession); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    PostImaList(output, GetListType(), [&](auto& list) {
      ImaWalk(input).Sessions(kTexts,
                              [&](const Session& session) { list.Append(NewRow(kSession, session)); });
    });
  }
};

template NodePtr Make<SessionList>();

}  // namespace TessaroCli::IscsiNamespace

/// The keys of the simulated network: portals that behave in some way of their own, and targets.
#pragma once

#include "host/LevelSchema.h"
#include "host/Negotiation.h"

namespace simulator {

using namespace host;

inline constexpr Key kRemoteChapKeys[] = {
    Word("level",
         "Whether the initiator has to prove itself: prohibited never, required always, with the others if "
         "the initiator wishes.",
         kDemands),
    Text("name", "The CHAP name that the initiator has to give."),
    Text("secret", "The CHAP secret that the initiator has to know.").Secret(),
    Text("mutualName", "The CHAP name with which the target proves itself; empty where it cannot."),
    Text("mutualSecret", "The CHAP secret with which the target proves itself.").Secret(),
};

inline constexpr Key kRedirectKeys[] = {
    kHostKey,
    kPortKey,
    Boolean("permanent", "It has moved for good (0x0102), and not for a while (0x0101)."),
};

constexpr Key StatusKey(std::string_view help) { return Integer("status", help, 0, 0xffff); }

inline constexpr Key kRemotePortalKeys[] = {
    kHostKey,
    kPortKey,
    Boolean("answers", "Something answers there; otherwise everything times out.", true),
    Nested("redirect", "Where it sends everyone.", kRedirectKeys).Optional(),
    StatusKey(
        "The Status-Class and Status-Detail with which it refuses everyone; 769 is 0x0301. 0 for none."),
    Nested("chap", "What it demands of those who ask for its targets.", kRemoteChapKeys),
};

inline constexpr Key kRemoteAddressKeys[] = {
    kHostKey,
    kPortKey,
    Integer("tag", "The target portal group tag.", 0, kUint16Most).Default(1),
};
inline constexpr Key kRemoteAddress[] = {Nested("", "", kRemoteAddressKeys)};
inline constexpr Key kRefusedName[] = {Text("", "")};

inline constexpr auto kRemoteParameterKeys = [] {
  constexpr std::size_t count = std::size(kNegotiationRules);
  std::array<Key, count + 3> keys;
  constexpr std::string_view help = "What the target brings to the negotiation.";
  constexpr OperationalParameters defaults;
  for (std::size_t i = 0; i < count; ++i) {
    const NegotiationRule& rule = kNegotiationRules[i];
    const Key key = rule.IsTruth() ? Boolean(rule.key, help) : Integer(rule.key, help, rule.least, rule.most);
    keys[i] = key.Default(std::int64_t{defaults.*rule.value});
  }
  keys[count] =
      Integer("maxRecvDataSegmentLength", "What the target takes, in bytes.", kLeastLength, kMostLength)
          .Default(std::int64_t{defaults.maxRecvDataSegmentLength});
  keys[count + 1] = Word("headerDigest",
                         "prohibited: it knows none; required: it takes nothing else; with the others as "
                         "the initiator wishes.",
                         kDemands);
  keys[count + 2] = Word("dataDigest", "The same for data.", kDemands);
  return keys;
}();

inline constexpr Key kRemoteTargetKeys[] = {
    Text("name", "The iSCSI name, of at most 223 characters.", TargetNameFault).Required(),
    Text("alias", "The alias that the target tells of itself."),
    List("portals", "Where it answers.", kRemoteAddress),
    Boolean("reported", "Its portals tell of it.", true),
    StatusKey(
        "The Status-Class and Status-Detail with which it refuses everyone; 516 is 0x0204. 0 for none."),
    List("refusedInitiators", "The names of initiators that it does not let in (0x0202).", kRefusedName),
    Unsigned16("maxSessions", "The most sessions that it admits (0x0302 from then on).").Default(kUint16Most),
    Nested("chap", "What it demands, and how it proves itself.", kRemoteChapKeys),
    Nested("parameters", "What it brings to the negotiation of a session.", kRemoteParameterKeys),
};

inline constexpr std::string_view kRemotePortalName[] = {"host", "port"};

}  // namespace simulator

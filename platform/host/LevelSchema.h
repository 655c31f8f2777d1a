/// The keys of session parameters and CHAP entries at the levels of an adapter, and of the lists of
/// sendtargets and static targets.
#pragma once

#include <array>

#include "host/PendingSchema.h"
#include "host/TargetSchema.h"

namespace host {

/// A session parameter, and what holds of it at an adapter whose description does not say otherwise. A truth
/// value is 0 or 1.
struct ParameterSpec {
  std::string_view name;
  Type type;  // Integer or Boolean
  std::int64_t value;
  std::int64_t least = 0;
  std::int64_t most = 1;
  bool isLong = false;  // its numbers have 64 bits, and not 32
};

/// The defaults are those of RFC 7143 section 13 where it has the key.
inline constexpr ParameterSpec kParameters[] = {
    {"ErrorRecoveryLevel", Type::Integer, 0, 0, 2},
    {"InitialLoginRetryMax", Type::Integer, 4, 1, 16},
    {"InitialR2T", Type::Boolean, 1},
    {"FirstBurstLength", Type::Integer, 65536, 512, 16777215, true},
    {"MaxBurstLength", Type::Integer, 262144, 512, 16777215, true},
    {"MaxRecvDataSegment", Type::Integer, 8192, 512, 16777215, true},
    {"MaxOutstandingR2T", Type::Integer, 1, 1, 65535},
    {"MaxCmds", Type::Integer, 128, 2, 2048},
    {"ImmediateData", Type::Boolean, 1},
    {"DefaultTime2Retain", Type::Integer, 20, 0, 3600},
    {"DefaultTime2Wait", Type::Integer, 2, 0, 3600},
    {"LoginTimeout", Type::Integer, 15, 1, 60},
    {"LogoutTimeout", Type::Integer, 15, 1, 60},
    {"NoopOutInterval", Type::Integer, 15, 1, 60},
    {"NoopOutTimeout", Type::Integer, 10, 1, 60},
    {"RecoveryTimeout", Type::Integer, 10, 1, 120},
    {"DelayedAck", Type::Boolean, 1},
};
inline constexpr std::string_view kDigests[] = {"HeaderDigest", "DataDigest"};

/// Levels of digests and of CHAP, by their numbers less one.
inline constexpr std::string_view kDemands[] = {"prohibited", "discouraged", "preferred", "required"};

constexpr Key NumberKey(const ParameterSpec& spec, std::string_view name, std::string_view help) {
  if (!spec.isLong) return Integer(name, help);
  return Integer(name, help, std::numeric_limits<std::int64_t>::min(),
                 std::numeric_limits<std::int64_t>::max());
}

constexpr Key ValueKey(const ParameterSpec& spec, std::string_view name, std::string_view help) {
  const Key key = spec.type == Type::Boolean ? Boolean(name, help) : NumberKey(spec, name, help);
  return key.Default(spec.value);
}

/// The keys of each parameter of an adapter; a truth value has no range.
inline constexpr auto kParameterKeys = [] {
  std::array<std::array<Key, 6>, std::size(kParameters)> keys;
  for (std::size_t i = 0; i < keys.size(); ++i) {
    const ParameterSpec& spec = kParameters[i];
    keys[i] = {ValueKey(spec, "current", "The value that holds."),
               ValueKey(spec, "default", "The value to go back to."),
               Boolean("settable", "It can be set, at all levels.", true),
               Boolean("supported", "The adapter has it.", true),
               NumberKey(spec, "min", "The least value.").Default(spec.least),
               NumberKey(spec, "max", "The greatest value.").Default(spec.most)};
  }
  return keys;
}();

/// A key for each parameter, as @p make makes it from its number, and for each digest.
template <class Make>
constexpr auto ParameterKeys(std::string_view digestHelp, Make make) {
  std::array<Key, std::size(kParameters) + std::size(kDigests)> keys;
  std::size_t count = 0;
  for (; count < std::size(kParameters); ++count) keys[count] = make(count).Optional();
  for (const std::string_view digest : kDigests)
    keys[count++] = Word(digest, digestHelp, kDemands).Optional();
  return keys;
}

inline constexpr auto kAdapterParameterKeys = ParameterKeys("Without it, prohibited.", [](std::size_t i) {
  const std::span<const Key> keys = kParameterKeys[i];
  return Nested(kParameters[i].name, "Without it, all its keys have their defaults.",
                keys.first(kParameters[i].type == Type::Boolean ? 4 : 6));
});

/// The same below an adapter: values alone, of those that are not inherited.
inline constexpr auto kOverrideKeys = ParameterKeys("Without it, inherited.", [](std::size_t i) {
  return ValueKey(kParameters[i], kParameters[i].name, "Without it, inherited.");
});

inline constexpr std::string_view kDirections[] = {"uni", "mutual"};

inline constexpr Key kChapEntryKeys[] = {
    Text("name", "The CHAP name.").Default("none"),
    Text("secret", "The CHAP secret.").Default("none").Secret(),
    Word("level", "How strongly CHAP is asked for.", kDemands),
};
inline constexpr Key kChapKeys[] = {
    Nested("uni", "The target asks the initiator; without it, prohibited.", kChapEntryKeys).Optional(),
    Nested("mutual", "The initiator asks the target too; without it, prohibited.", kChapEntryKeys).Optional(),
};

inline constexpr Key kLowerChapEntryKeys[] = {
    Boolean("inherited", "The entry of the parent holds, not this one."),
    kChapEntryKeys[0],
    kChapEntryKeys[1],
    kChapEntryKeys[2],
};
inline constexpr Key kLowerChapKeys[] = {
    Nested("uni", "The target asks the initiator; without it, inherited.", kLowerChapEntryKeys).Optional(),
    Nested("mutual", "The initiator asks the target too; without it, inherited.", kLowerChapEntryKeys)
        .Optional(),
};

/// A host in the one form in which it is found again.
std::string CanonicalHostFault(std::string_view text);

inline constexpr Key kHostKey =
    Text("host", "The address or the name; an IPv6 address as RFC 5952 writes it.", CanonicalHostFault)
        .Required()
        .Folded();
inline constexpr Key kPortKey = Integer("port", "The TCP port.", 0, 65535).Default(3260);
inline constexpr Key kOverridesKey =
    Nested("parameters", "The session parameters that are not inherited.", kOverrideKeys);
inline constexpr Key kLowerChapKey = Nested("chap", "The CHAP entries.", kLowerChapKeys);

inline constexpr Key kPortalKeys[] = {kHostKey, kPortKey};

inline constexpr Key kPlaceSettingKeys[] = {kOverridesKey};
inline constexpr auto kPlacePendingKeys = PendingKeys(kPlaceSettingKeys);
inline constexpr Key kPlacePendingKey = PendingKey(kPlacePendingKeys);

inline constexpr Key kSendTargetKeys[] = {kHostKey, kPortKey, kOverridesKey, kLowerChapKey, kPlacePendingKey};
inline constexpr std::string_view kSendTargetName[] = {"host", "port"};

inline constexpr Key kStaticTargetKeys[] = {
    Text("name", "The iSCSI name of the target.", TargetNameFault).Required(),
    kHostKey,
    kPortKey,
    Integer("portalGroup", "The target portal group tag, where it is known.", 0, 65535).Optional(),
    Boolean("boot", "The host boots from it."),
    Nested("sendTarget",
           "The sendtarget through which it was found; it inherits from that one unless it is static too.",
           kPortalKeys)
        .Optional(),
    Boolean("static", "It is a static target besides; without a sendTarget it always is one.").Optional(),
    kOverridesKey,
    kLowerChapKey,
    kPlacePendingKey,
};
inline constexpr std::string_view kStaticTargetName[] = {"name", "host", "port"};

// Each says what is wrong with the parameters of a record; empty when nothing is.
std::string ParameterFault(const Record& adapter);
std::string OverrideFault(const Record& place, const Record& adapter);

}  // namespace host

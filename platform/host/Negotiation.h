/// What two sides of a login agree on: RFC 7143 section 13.
#pragma once

#include <optional>
#include <string_view>

#include "host/Network.h"

#pragma GCC visibility push(default)

namespace host {

struct NegotiationRule {
  /// Of two truth values, the least is their AND and the greatest their OR.
  enum class Result : std::uint8_t { Least, Greatest };
  std::string_view key;        // in the records of sessions and of remote targets
  std::string_view parameter;  // of the initiator's levels; empty where it always offers the default
  std::uint32_t OperationalParameters::*value;
  Result result;
  // The range of numbers; a truth value has none.
  std::int64_t least = 0;
  std::int64_t most = 0;
  constexpr bool IsTruth() const { return most == 0; }
};

inline constexpr std::int64_t kLeastLength = 512;  // bytes, of bursts and data segments
inline constexpr std::int64_t kMostLength = 16777215;

inline constexpr NegotiationRule kNegotiationRules[] = {
    {"maxConnections", "", &OperationalParameters::maxConnections, NegotiationRule::Result::Least, 1, 65535},
    {"initialR2T", "InitialR2T", &OperationalParameters::initialR2T, NegotiationRule::Result::Greatest},
    {"immediateData", "ImmediateData", &OperationalParameters::immediateData, NegotiationRule::Result::Least},
    {"maxBurstLength", "MaxBurstLength", &OperationalParameters::maxBurstLength,
     NegotiationRule::Result::Least, kLeastLength, kMostLength},
    {"firstBurstLength", "FirstBurstLength", &OperationalParameters::firstBurstLength,
     NegotiationRule::Result::Least, kLeastLength, kMostLength},
    {"defaultTime2Wait", "DefaultTime2Wait", &OperationalParameters::defaultTime2Wait,
     NegotiationRule::Result::Greatest, 0, 3600},
    {"defaultTime2Retain", "DefaultTime2Retain", &OperationalParameters::defaultTime2Retain,
     NegotiationRule::Result::Least, 0, 3600},
    {"maxOutstandingR2T", "MaxOutstandingR2T", &OperationalParameters::maxOutstandingR2T,
     NegotiationRule::Result::Least, 1, 65535},
    {"dataPduInOrder", "", &OperationalParameters::dataPduInOrder, NegotiationRule::Result::Greatest},
    {"dataSequenceInOrder", "", &OperationalParameters::dataSequenceInOrder,
     NegotiationRule::Result::Greatest},
    {"errorRecoveryLevel", "ErrorRecoveryLevel", &OperationalParameters::errorRecoveryLevel,
     NegotiationRule::Result::Least, 0, 2},
};

/// Whether a thing is done that the initiator offers and the target chooses: the first of the initiator's
/// choices that the target takes. Nothing where there is none.
std::optional<bool> Choose(Demand initiator, Demand target);

struct Agreement {
  OperationalParameters values;  // those of kNegotiationRules; the others are of no meaning
  bool headerDigest = false;
  bool dataDigest = false;
  // Each side only declares what it takes.
  std::uint32_t receives = 0;
  std::uint32_t transmits = 0;
};

/// Nothing where the sides have no digest in common.
std::optional<Agreement> Negotiate(const OperationalParameters& initiator,
                                   const OperationalParameters& target);

}  // namespace host

#pragma GCC visibility pop

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
  bool isTruth = false;
};

inline constexpr NegotiationRule kNegotiationRules[] = {
    {"maxConnections", "", &OperationalParameters::maxConnections, NegotiationRule::Result::Least},
    {"initialR2T", "InitialR2T", &OperationalParameters::initialR2T, NegotiationRule::Result::Greatest, true},
    {"immediateData", "ImmediateData", &OperationalParameters::immediateData, NegotiationRule::Result::Least,
     true},
    {"maxBurstLength", "MaxBurstLength", &OperationalParameters::maxBurstLength,
     NegotiationRule::Result::Least},
    {"firstBurstLength", "FirstBurstLength", &OperationalParameters::firstBurstLength,
     NegotiationRule::Result::Least},
    {"defaultTime2Wait", "DefaultTime2Wait", &OperationalParameters::defaultTime2Wait,
     NegotiationRule::Result::Greatest},
    {"defaultTime2Retain", "DefaultTime2Retain", &OperationalParameters::defaultTime2Retain,
     NegotiationRule::Result::Least},
    {"maxOutstandingR2T", "MaxOutstandingR2T", &OperationalParameters::maxOutstandingR2T,
     NegotiationRule::Result::Least},
    {"dataPduInOrder", "", &OperationalParameters::dataPduInOrder, NegotiationRule::Result::Greatest, true},
    {"dataSequenceInOrder", "", &OperationalParameters::dataSequenceInOrder,
     NegotiationRule::Result::Greatest, true},
    {"errorRecoveryLevel", "ErrorRecoveryLevel", &OperationalParameters::errorRecoveryLevel,
     NegotiationRule::Result::Least},
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

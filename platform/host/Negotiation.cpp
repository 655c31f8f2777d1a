#include "host/Negotiation.h"

#include <algorithm>

namespace host {

std::optional<bool> Choose(Demand initiator, Demand target) {
  const bool isRefused = (initiator == Demand::Prohibited && target == Demand::Required) ||
                         (initiator == Demand::Required && target == Demand::Prohibited);
  if (isRefused) return {};
  const bool isWished = initiator == Demand::Preferred || initiator == Demand::Required;
  return isWished ? target != Demand::Prohibited : target == Demand::Required;
}

std::optional<Agreement> Negotiate(const OperationalParameters& initiator,
                                   const OperationalParameters& target) {
  const auto header = Choose(initiator.headerDigest, target.headerDigest);
  const auto data = Choose(initiator.dataDigest, target.dataDigest);
  if (!header || !data) return {};
  Agreement agreement{.values = {},
                      .headerDigest = *header,
                      .dataDigest = *data,
                      .receives = initiator.maxRecvDataSegmentLength,
                      .transmits = target.maxRecvDataSegmentLength};
  for (const NegotiationRule& rule : kNegotiationRules) {
    const auto [least, greatest] = std::minmax(initiator.*rule.value, target.*rule.value);
    agreement.values.*rule.value = rule.result == NegotiationRule::Result::Least ? least : greatest;
  }
  // RFC 7143 section 13.14: the first burst is a part of a burst.
  agreement.values.firstBurstLength =
      std::min(agreement.values.firstBurstLength, agreement.values.maxBurstLength);
  return agreement;
}

}  // namespace host

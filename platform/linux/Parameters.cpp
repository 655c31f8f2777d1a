#include "linux/Parameters.h"

#include <algorithm>

namespace linux {

namespace {

/// The digests in the order of preference, by the host::Demand for one.
constexpr std::string_view kDigestWords[] = {"None", "None,CRC32C", "CRC32C,None", "CRC32C"};

std::string Written(Writing writing, std::int64_t value) {
  if (writing == Writing::YesOrNo) return value != 0 ? "Yes" : "No";
  if (writing == Writing::Digest) return std::string(kDigestWords[std::clamp<std::int64_t>(value, 0, 3)]);
  return std::to_string(value);
}

}  // namespace

Record ParameterLines(std::span<const ParameterValue> values) {
  Record lines;
  for (const auto& [parameter, value] : values) {
    const auto* const name = std::ranges::find(kParameterNames, parameter, &ParameterName::parameter);
    if (name == std::end(kParameterNames) || name->record.empty()) continue;
    lines.emplace_back(name->record, Written(name->writing, value));
  }
  return lines;
}

std::vector<ParameterValue> ValuesOf(const host::OperationalParameters& offer) {
  return {{"InitialR2T", offer.initialR2T},
          {"FirstBurstLength", offer.firstBurstLength},
          {"MaxBurstLength", offer.maxBurstLength},
          {"MaxRecvDataSegment", offer.maxRecvDataSegmentLength},
          {"MaxOutstandingR2T", offer.maxOutstandingR2T},
          {"ImmediateData", offer.immediateData},
          {"DefaultTime2Retain", offer.defaultTime2Retain},
          {"DefaultTime2Wait", offer.defaultTime2Wait},
          {"HeaderDigest", static_cast<std::int64_t>(offer.headerDigest)},
          {"DataDigest", static_cast<std::int64_t>(offer.dataDigest)}};
}

std::vector<ParameterValue> ValuesOf(const host::Conduct& conduct) {
  return {{"InitialLoginRetryMax", conduct.loginRetries}, {"MaxCmds", conduct.maxCommands},
          {"LoginTimeout", conduct.loginTimeout},         {"LogoutTimeout", conduct.logoutTimeout},
          {"NoopOutInterval", conduct.noopOutInterval},   {"NoopOutTimeout", conduct.noopOutTimeout},
          {"RecoveryTimeout", conduct.recoveryTimeout}};
}

}  // namespace linux

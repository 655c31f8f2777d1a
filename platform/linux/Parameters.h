/// The session parameters of an adapter as open-iscsi's records name them.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "host/Network.h"
#include "linux/Records.h"

#pragma GCC visibility push(default)

namespace linux {

/// How a record writes the value of a parameter.
enum class Writing { Number, YesOrNo, Digest };

/// One parameter of the 19. What has no record name cannot be set on Linux.
struct ParameterName {
  std::string_view parameter;
  std::string_view record;
  Writing writing = Writing::Number;
};

inline constexpr ParameterName kParameterNames[] = {
    {"ErrorRecoveryLevel", {}},  // the kernel's initiator has level 0 alone
    {"InitialLoginRetryMax", "node.session.initial_login_retry_max"},
    {"InitialR2T", "node.session.iscsi.InitialR2T", Writing::YesOrNo},
    {"FirstBurstLength", "node.session.iscsi.FirstBurstLength"},
    {"MaxBurstLength", "node.session.iscsi.MaxBurstLength"},
    {"MaxRecvDataSegment", "node.conn[0].iscsi.MaxRecvDataSegmentLength"},
    {"MaxOutstandingR2T", "node.session.iscsi.MaxOutstandingR2T"},
    {"MaxCmds", "node.session.cmds_max"},
    {"ImmediateData", "node.session.iscsi.ImmediateData", Writing::YesOrNo},
    {"DefaultTime2Retain", "node.session.iscsi.DefaultTime2Retain"},
    {"DefaultTime2Wait", "node.session.iscsi.DefaultTime2Wait"},
    {"LoginTimeout", "node.conn[0].timeo.login_timeout"},
    {"LogoutTimeout", "node.conn[0].timeo.logout_timeout"},
    {"NoopOutInterval", "node.conn[0].timeo.noop_out_interval"},
    {"NoopOutTimeout", "node.conn[0].timeo.noop_out_timeout"},
    {"RecoveryTimeout", "node.session.timeo.replacement_timeout"},
    {"DelayedAck", {}},  // Linux decides for itself when to acknowledge
    {"HeaderDigest", "node.conn[0].iscsi.HeaderDigest", Writing::Digest},
    {"DataDigest", "node.conn[0].iscsi.DataDigest", Writing::Digest},
};

/// A parameter with its value; a truth value is 0 or 1, a digest a host::Demand.
struct ParameterValue {
  std::string_view parameter;
  std::int64_t value = 0;
};

/// The lines of a record that set these parameters; one without a name there is left out.
Record ParameterLines(std::span<const ParameterValue> values);

/// The parameters that the operational stage of a login is about.
std::vector<ParameterValue> ValuesOf(const host::OperationalParameters& offer);
/// And those that none is about.
std::vector<ParameterValue> ValuesOf(const host::Conduct& conduct);

}  // namespace linux

#pragma GCC visibility pop

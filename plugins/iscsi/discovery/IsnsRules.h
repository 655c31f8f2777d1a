/// iSNS servers and the one parameter of iSNS discovery, which an adapter has for itself and for each server.
#pragma once

#include <optional>

#include "CommandFrame.h"
#include "IscsiUtil/Parameters.h"

namespace TessaroCli::IscsiNamespace {

using IscsiUtil::kParm;
using NodeCtl::Storage::iSnsConfig;
using NodeCtl::Storage::iSnsParms;

/// The server that the options `method` and `address` name. Nothing when they name none, which is then
/// reported, with @p addressFailure behind the reason where the address is malformed.
std::optional<iSnsConfig> ServerFrom(const InputPtr& input, const OutputPtr& output,
                                     const char* addressFailure);

/// WithAdapter, where no failure of the lookup gets by: each is an unknown adapter.
template <class Body>
void WithIsnsAdapter(const InputPtr& input, const OutputPtr& output, const char* failureText, Body&& body) {
  std::unique_ptr<iScsiInterface> adapter;
  Guarded(output, {InvalidAdapterMessage}, [&] { adapter = FindAdapter(input, output); });
  if (adapter) Guarded(output, {failureText, FailureReport::Reason::First}, [&] { body(*adapter); });
}

/// Where iSNS parameters are kept.
struct IsnsPlace {
  bool inherits;  ///< the place has a parent, and the option `inherit`
  const char* failureText;
  iSnsParms (*get)(iScsiInterface& adapter, const iSnsConfig& server);
  void (*set)(iScsiInterface& adapter, const iSnsConfig& server, const iSnsParms& parms,
              const OutputPtr& output);
};

/// Posts the row of the parameter. One that the place does not have is shown by its name alone.
void ShowIsnsParm(const iSnsParms& parms, const OutputPtr& output);
/// How many of the options that say what to set were given.
int CountIsnsSources(const InputPtr& input, bool inherits);
/// Sets the parameter as the options `key`, and one of `value`, `inherit` and `default`, say. @p server is of
/// no matter for the adapter's own place.
void SetIsnsParm(const IsnsPlace& place, const iSnsConfig& server, const InputPtr& input,
                 const OutputPtr& output);

constexpr Parameter IsnsAddress(const char* help) { return String("address", 'a', help); }
constexpr char kIsnsMethodHelp[] = "The iSNS discovery method: <static/dhcp/slp>. Only static supported.";
constexpr Parameter IsnsMethod(const char* help = kIsnsMethodHelp) {
  return String("method", 'm', help).Required();
}

}  // namespace TessaroCli::IscsiNamespace

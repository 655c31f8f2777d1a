/// The steps that logging sessions in and out share.
#pragma once

#include "ImaWalk.h"

namespace TessaroCli::IscsiNamespace {

constexpr Option SessionIsid() {
  return StringOption("isid", 's', "The isid of a session to duplicate for login.");
}

/// Applies @p change to the adapter, target or session that the options select; reports @p failure if it
/// fails.
template <class Change>
void ChangeSessions(const InputPtr& input, const OutputPtr& output, const char* failure, Change&& change) {
  IMA_OID selected{};
  if (!IscsiTools::GetSessionOidFromInput(input, output, &selected)) {
    return output->ReportError("Failed to find matching object.");
  }
  ReportingImaFailures(*output, [&] {
    CheckIma(change(selected), failure);
    PostSuccess(output);
  });
}

}  // namespace TessaroCli::IscsiNamespace

/// Binding a host NIC to an adapter and unbinding it, which differ in the operation and in words.
#pragma once

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

struct Binding {
  void (iScsiInterface::*change)(const std::string& nic, bool force);
  const char* failures[2];  ///< what is reported of a refusal, without and with force
};

inline void ChangeBinding(const InputPtr& input, const OutputPtr& output, const Binding& binding) {
  const std::string nic = input->GetString("nic");
  if (nic.empty()) return output->ReportError(InvalidNetworkPortalInputMessage);
  const bool force = input->HasParameter("force") && input->GetBool("force");
  WithAdapter(input, output, {binding.failures[force]}, [&](iScsiInterface& adapter) {
    (adapter.*binding.change)(nic, force);
    PostSuccess(output);
  });
}

constexpr Parameter BoundHostnic() {
  return String("nic", 'n', "The iSCSI network portal (bound hostnic)").Required();
}

}  // namespace TessaroCli::IscsiNamespace

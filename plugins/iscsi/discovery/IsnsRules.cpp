#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {

std::optional<iSnsConfig> ServerNamed(const std::string& method, const std::string& address,
                                      const char* addressFailure, const OutputPtr& output) {
  if (method != "static") {
    output->ReportError("Only static discovery method supported");
    return std::nullopt;
  }
  if (address.empty()) {
    output->ReportError("Address required for static discovery method");
    return std::nullopt;
  }
  std::optional<iSnsConfig> server;
  Guarded(output, ReportingReasonThen(addressFailure), [&] {
    server =
        iSnsConfig{NodeCtl::Storage::iSnsDiscoveryMethod::Static, NodeCtl::Network::HostAddress(address)};
  });
  return server;
}

void ShowIsnsParm(const iSnsParms& parms, const OutputPtr& output) {
  const auto text = [](std::int32_t number) { return std::to_string(static_cast<std::uint32_t>(number)); };
  const StructPtr row = IscsiTools::ParmStructure();
  row->SetField("Name", "PollInterval");
  if (parms.valid) {
    row->SetField("Current", text(parms.current));
    row->SetField("Default", text(parms.defaultValue));
    row->SetField("Min", text(parms.min));
    row->SetField("Max", text(parms.max));
    row->SetField("Settable", parms.settable);
    row->SetField("Inherit", parms.inherited);
  }
  const ListPtr list = NewList(IscsiTools::ParmStructure());
  list->Append(row);
  Post(output, list);
}

}  // namespace TessaroCli::IscsiNamespace

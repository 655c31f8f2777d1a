#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {

std::optional<iSnsConfig> ServerFrom(const InputPtr& input, const OutputPtr& output,
                                     const char* addressFailure) {
  const std::string address = input->GetString("address");
  const char* refusal = input->GetString("method") != "static" ? "Only static discovery method supported"
                        : address.empty() ? "Address required for static discovery method"
                                          : nullptr;
  if (refusal != nullptr) {
    output->ReportError(refusal);
    return std::nullopt;
  }
  std::optional<iSnsConfig> server;
  Guarded(output, {addressFailure, FailureReport::Reason::First}, [&] {
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
  const ListPtr list = NewList(kParm);
  list->Append(row);
  Post(output, list);
}

int CountIsnsSources(const InputPtr& input, bool inherits) {
  return int{input->HasParameter("value")} + int{input->HasParameter("default")} +
         int{inherits && input->HasParameter("inherit")};
}

void SetIsnsParm(const IsnsPlace& place, const iSnsConfig& server, const InputPtr& input,
                 const OutputPtr& output) {
  const std::string key = input->GetString("key");
  if (input->HasParameter("key") && key.empty()) return output->ReportError(InvalidKeyMessage);
  const bool hasValue = input->HasParameter("value");
  const std::string value = input->GetString("value");
  if (hasValue && value.empty()) return output->ReportError(InvalidValueMessage);

  WithIsnsAdapter(input, output, place.failureText, [&](iScsiInterface& adapter) {
    iSnsParms parms = place.get(adapter, server);
    if (!IscsiTools::IsIsnsParmSettable(key, parms)) {
      return output->ReportError("Parameter " + key + " is not settable.\n");
    }
    const bool inherit = place.inherits && input->HasParameter("inherit");
    if (hasValue) {
      IscsiTools::IsnsParmSet(key, value, parms);
    } else if (inherit) {
      if (!input->GetFlag("inherit")) return PostSuccess(output);
      IscsiTools::IsnsParmInherit(key, parms);
    } else {
      if (!input->GetFlag("default")) return output->ReportError(InvalidDefaultUseMessage);
      IscsiTools::IsnsParmDefault(key, parms);
    }
    place.set(adapter, server, parms, output);
    PostSuccess(output);
  });
}

}  // namespace TessaroCli::IscsiNamespace

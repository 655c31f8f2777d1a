#include "host/AdapterSchema.h"

#include "host/Pending.h"

namespace host {

namespace {

std::string PlaceFault(Kind kind, const Record& place, const Record& adapter) {
  std::string fault = OverrideFault(place, adapter);
  if (!fault.empty() || !place.Has("pending")) return fault;
  const Object object{.kind = kind, .name = {}, .record = place};
  fault = OverrideFault(Configured(object).record, adapter);
  return fault.empty() ? "" : "pending: " + fault;
}

}  // namespace

std::string AdapterFault(const Record& adapter) {
  std::string fault = ParameterFault(adapter);
  if (fault.empty()) fault = AddressListFault(adapter, "network.ipv6Addresses");
  if (!fault.empty() || !adapter.Has("pending")) return fault;
  const Object object{.kind = Kind::Adapter, .name = {}, .record = adapter};
  try {
    Configured(object);
  } catch (const Error& error) {
    return std::string("pending: ") + error.what();
  }
  return {};
}

std::string SendTargetFault(const Record& place, const Record& adapter) {
  return PlaceFault(Kind::SendTarget, place, adapter);
}

std::string StaticTargetFault(const Record& place, const Record& adapter) {
  return PlaceFault(Kind::StaticTarget, place, adapter);
}

std::string NetworkPortalFault(const Record&, const Record& adapter) {
  const std::string& kind = adapter.GetString("kind");
  if (kind == "software" || kind == "dependent") return {};
  return "only a software or dependent adapter has NICs bound to it, and this one is of the kind " +
         Quoted(kind);
}

std::string LogicalPortalFault(const Record&, const Record& adapter) {
  const std::string& kind = adapter.GetString("kind");
  if (kind == "independent") return {};
  return "only an independent adapter has portals of its own, and this one is of the kind " + Quoted(kind);
}

}  // namespace host

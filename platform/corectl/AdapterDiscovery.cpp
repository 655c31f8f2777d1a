#include "corectl/Level.h"
#include "host/Discovery.h"
#include "host/Formats.h"
#include "host/Targets.h"

namespace corectl {

namespace {

void Require(const host::Object& adapter, std::string_view capability, const std::string& what) {
  if (adapter.record.GetBool("capabilities/" + std::string(capability))) return;
  Deny(Why::NotSupported,
       "The adapter " + adapter.name + " takes no " + what + ": it lacks " + host::Quoted(capability) + ".");
}

/// Refuses an address of a form that the adapter does not take.
void RequireAddressForm(const host::Object& adapter, const TargetAddress& address) {
  const std::string host = address.host.GetStringAddress();
  if (host.empty()) Deny(Why::Invalid, "The address has no host.");
  const bool isIpv6 = address.host.GetFamily() == Network::AddressFamily::Ipv6;
  const std::string_view lacked = host::LackedFor(adapter.record, host);
  if (!lacked.empty()) Require(adapter, lacked, isIpv6 ? "IPv6 addresses" : "host names");
}

TargetAddress AddressIn(const host::Record& record) {
  return {Network::HostAddress(record.GetString("host")), static_cast<std::uint16_t>(record.GetInt("port"))};
}

/// The places of a kind, in order, each as @p make makes it from its record.
template <class Place, class Make>
std::vector<Place*> PlacesOf(host::Tree& tree, const host::Object& adapter, host::Kind kind, Make make) {
  std::vector<std::unique_ptr<Place>> places;
  for (const host::Object& object : tree.Children(adapter.id, kind)) {
    places.push_back(std::make_unique<Place>(make(object.record)));
  }
  return HandOut(std::move(places));
}

}  // namespace

void Adapter::Rediscover() {
  ref_.Change("Rediscover", {},
              [](host::Tree& tree, const host::Object& adapter) { host::Rediscover(tree, adapter); });
}

Adapter::iScsiDiscoveryStatus Adapter::GetDiscoveryStatus() {
  return ref_.Read("GetDiscoveryStatus", [](host::Tree&, const host::Object& adapter) {
    return static_cast<iScsiDiscoveryStatus>(adapter.record.GetInt("discoveryStatus"));
  });
}

void Adapter::AddStaticTarget(StaticTarget target) {
  ref_.Change("AddStaticTarget", {PlaceText(target)}, [&](host::Tree& tree, const host::Object& adapter) {
    Require(adapter, "Static Discovery Settable", "static targets");
    RequireInitiatorName(target.name);
    RequireAddressForm(adapter, target.address);
    auto place = LookupPlace(tree, adapter, target);
    if (!place || host::IsStatic(place->record)) return AddPlace(tree, adapter, target);
    place->record.Set("static", true);  // and stays found
    tree.Update(*place);
  });
}

void Adapter::RemoveStaticTarget(StaticTarget target) {
  ref_.Change("RemoveStaticTarget", {PlaceText(target)}, [&](host::Tree& tree, const host::Object& adapter) {
    host::Object found = FindPlace(tree, adapter, target);
    if (!host::IsStatic(found.record)) {
      Deny(Why::WrongState, PlaceText(target) + " is no static target: it was found through the " +
                                "sendtarget " +
                                PortalText(found.record.GetString("sendTarget/host"),
                                           found.record.GetInt64("sendTarget/port")) +
                                ".");
    }
    if (found.record.Has("sendTarget")) {
      found.record.Erase("static");
      found.record.Set("boot", false);
      return tree.Update(found);
    }
    tree.Remove(found.id);
    const auto known = tree.Find(adapter.id, host::Kind::Target, target.name);
    if (known) host::ForgetTarget(tree, *known);
  });
}

std::vector<StaticTarget*> Adapter::GetStaticTargets() {
  return ref_.Read("GetStaticTargets", [](host::Tree& tree, const host::Object& adapter) {
    return PlacesOf<StaticTarget>(tree, adapter, host::Kind::StaticTarget, [](const host::Record& record) {
      return StaticTarget(record.GetString("name"), AddressIn(record));
    });
  });
}

void Adapter::AddSendTargetAddress(TargetAddress address) {
  ref_.Change("AddSendTargetAddress", {PlaceText(address)},
              [&](host::Tree& tree, const host::Object& adapter) {
                Require(adapter, "Sendtarget Discovery Settable", "sendtargets");
                RequireAddressForm(adapter, address);
                AddPlace(tree, adapter, address);
              });
}

void Adapter::RemoveSendTargetAddress(TargetAddress address) {
  ref_.Change("RemoveSendTargetAddress", {PlaceText(address)},
              [&](host::Tree& tree, const host::Object& adapter) {
                tree.Remove(FindPlace(tree, adapter, address).id);
              });
}

std::vector<TargetAddress*> Adapter::GetSendTargetAddresses() {
  return ref_.Read("GetSendTargetAddresses", [](host::Tree& tree, const host::Object& adapter) {
    return PlacesOf<TargetAddress>(tree, adapter, host::Kind::SendTarget, AddressIn);
  });
}

}  // namespace corectl

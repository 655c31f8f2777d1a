#include "corectl/Level.h"

namespace corectl {

namespace {

/// The key of a place in GivenParms; the adapter's is empty.
template <class... Key>
std::string PlaceOf(const Key&... key) {
  return (std::string() + ... + PlaceText(key));
}

template <class... Key>
iScsiParms GetParms(const AdapterRef& adapter, host::Operation operation, GivenParms& given,
                    const Key&... key) {
  iScsiParms parms = adapter.Read(operation, {host::Argument(PlaceText(key))...},
                                  OnLevel([](const Level& level) { return level.GetParms(); }, key...));
  given[PlaceOf(key...)] = parms;
  return parms;
}

template <class... Key>
Adapter::iScsiStatus SetParms(const AdapterRef& adapter, host::Operation operation, GivenParms& given,
                              const iScsiParms& parms, const Key&... key) {
  const std::string place = PlaceOf(key...);
  const auto known = given.find(place);
  const auto set = [&](Level& level) {
    return level.SetParms(parms, known == given.end() ? level.GetParms() : known->second);
  };
  const Status status =
      adapter.Change(operation, {host::Argument(PlaceText(key))..., ShownParms(parms)}, OnLevel(set, key...));
  if (status != Status::NotSupported) given[place] = parms;
  return static_cast<Adapter::iScsiStatus>(status);
}

template <class... Key>
iScsiDigestType GetDigest(const AdapterRef& adapter, host::Operation operation, Digest digest,
                          const Key&... key) {
  return adapter.Read(operation, {host::Argument(PlaceText(key))...},
                      OnLevel([digest](const Level& level) { return level.GetDigest(digest); }, key...));
}

template <class... Key>
Adapter::iScsiStatus SetDigest(const AdapterRef& adapter, host::Operation operation, Digest digest,
                               iScsiDigestType value, const Key&... key) {
  const auto set = [&](Level& level) { return level.SetDigest(digest, value); };
  return static_cast<Adapter::iScsiStatus>(adapter.Change(
      operation, {host::Argument(PlaceText(key))..., static_cast<int>(value)}, OnLevel(set, key...)));
}

}  // namespace

Adapter::iScsiStatus Adapter::SetHeaderDigest(iScsiDigestType digest) {
  return SetDigest(ref_, "SetHeaderDigest", Digest::Header, digest);
}
Adapter::iScsiStatus Adapter::SetTargetHeaderDigest(StaticTarget target, iScsiDigestType digest) {
  return SetDigest(ref_, "SetTargetHeaderDigest", Digest::Header, digest, target);
}
Adapter::iScsiStatus Adapter::SetSendTargetHeaderDigest(TargetAddress address, iScsiDigestType digest) {
  return SetDigest(ref_, "SetSendTargetHeaderDigest", Digest::Header, digest, address);
}
iScsiDigestType Adapter::GetHeaderDigest() { return GetDigest(ref_, "GetHeaderDigest", Digest::Header); }
iScsiDigestType Adapter::GetTargetHeaderDigest(StaticTarget target) {
  return GetDigest(ref_, "GetTargetHeaderDigest", Digest::Header, target);
}
iScsiDigestType Adapter::GetSendTargetHeaderDigest(TargetAddress address) {
  return GetDigest(ref_, "GetSendTargetHeaderDigest", Digest::Header, address);
}
Adapter::iScsiStatus Adapter::SetDataDigest(iScsiDigestType digest) {
  return SetDigest(ref_, "SetDataDigest", Digest::Data, digest);
}
Adapter::iScsiStatus Adapter::SetTargetDataDigest(StaticTarget target, iScsiDigestType digest) {
  return SetDigest(ref_, "SetTargetDataDigest", Digest::Data, digest, target);
}
Adapter::iScsiStatus Adapter::SetSendTargetDataDigest(TargetAddress address, iScsiDigestType digest) {
  return SetDigest(ref_, "SetSendTargetDataDigest", Digest::Data, digest, address);
}
iScsiDigestType Adapter::GetDataDigest() { return GetDigest(ref_, "GetDataDigest", Digest::Data); }
iScsiDigestType Adapter::GetTargetDataDigest(StaticTarget target) {
  return GetDigest(ref_, "GetTargetDataDigest", Digest::Data, target);
}
iScsiDigestType Adapter::GetSendTargetDataDigest(TargetAddress address) {
  return GetDigest(ref_, "GetSendTargetDataDigest", Digest::Data, address);
}

Adapter::iScsiStatus Adapter::SetAdapterParms(iScsiParms parms) {
  return SetParms(ref_, "SetAdapterParms", given_, parms);
}
iScsiParms Adapter::GetAdapterParms() { return GetParms(ref_, "GetAdapterParms", given_); }
Adapter::iScsiStatus Adapter::SetTargetParms(StaticTarget target, iScsiParms parms) {
  return SetParms(ref_, "SetTargetParms", given_, parms, target);
}
iScsiParms Adapter::GetTargetParms(StaticTarget target) {
  return GetParms(ref_, "GetTargetParms", given_, target);
}
Adapter::iScsiStatus Adapter::SetSendTargetParms(TargetAddress address, iScsiParms parms) {
  return SetParms(ref_, "SetSendTargetParms", given_, parms, address);
}
iScsiParms Adapter::GetSendTargetParms(TargetAddress address) {
  return GetParms(ref_, "GetSendTargetParms", given_, address);
}

}  // namespace corectl

#include "corectl/Level.h"
#include "host/Formats.h"

namespace corectl {

namespace {

template <class... Key>
void SetChap(const AdapterRef& adapter, host::Operation operation, const iScsiChapParameters& chap,
             int direction, const Key&... key) {
  const std::string shown = "{name=" + host::Quoted(chap.name) +
                            ", secret=" + host::Argument::Secret().Text() +
                            ", level=" + std::to_string(static_cast<int>(chap.level)) + "}";
  adapter.Change(operation, {host::Argument(PlaceText(key))..., host::Argument::Plain(shown), direction},
                 OnLevel([&](Level& level) { level.SetChap(chap, direction); }, key...));
}

template <class... Key>
void GetChap(const AdapterRef& adapter, host::Operation operation, iScsiChapParameters& chap, int direction,
             const Key&... key) {
  adapter.Read(operation, {host::Argument(PlaceText(key))..., direction},
               OnLevel([&](Level& level) { level.GetChap(chap, direction); }, key...));
}

}  // namespace

void Adapter::SetChapParameters(iScsiChapParameters chap, int direction) {
  SetChap(ref_, "SetChapParameters", chap, direction);
}
void Adapter::SetTargetChapParameters(StaticTarget target, iScsiChapParameters chap, int direction) {
  SetChap(ref_, "SetTargetChapParameters", chap, direction, target);
}
void Adapter::SetSendTargetChapParameters(TargetAddress address, iScsiChapParameters chap, int direction) {
  SetChap(ref_, "SetSendTargetChapParameters", chap, direction, address);
}
void Adapter::GetChapParameters(iScsiChapParameters& chap, int direction) {
  GetChap(ref_, "GetChapParameters", chap, direction);
}
void Adapter::GetTargetChapParameters(StaticTarget target, iScsiChapParameters& chap, int direction) {
  GetChap(ref_, "GetTargetChapParameters", chap, direction, target);
}
void Adapter::GetSendTargetChapParameters(TargetAddress address, iScsiChapParameters& chap, int direction) {
  GetChap(ref_, "GetSendTargetChapParameters", chap, direction, address);
}

}  // namespace corectl

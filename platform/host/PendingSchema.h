/// The keys that say when the settings of an adapter take effect, and those of changes that wait for it.
#pragma once

#include <array>

#include "host/Schema.h"

namespace host {

/// What takes effect together.
enum class Setting : std::uint8_t { Identity, Parameters, Network, Mtu, ArpRedirect, Isns };
/// When it does.
enum class Effect : std::uint8_t { Now, Reset, Reboot };

/// In the order of Effect.
inline constexpr std::string_view kEffects[] = {"now", "reset", "reboot"};

/// In the order of Setting.
struct SettingSpec {
  std::string_view name;
  std::string_view help;
  Effect ofIndependent;  // where the description does not say; Now on adapters of other kinds
};
inline constexpr SettingSpec kSettings[] = {
    {"identity", "The iSCSI name and the alias. Without it, now.", Effect::Now},
    {"parameters",
     "Session parameters, digests and what of them is inherited, at all levels. Without it, now.",
     Effect::Now},
    {"network", "Addresses, gateways, DNS servers, and how they are configured. Without it, now.",
     Effect::Now},
    // Its ports are its own, and frames of another size need them started anew.
    {"mtu", "The MTU. Without it, reset on an independent adapter, and now on others.", Effect::Reset},
    {"arpRedirect", "ArpRedirect. Without it, now.", Effect::Now},
    {"isns", "PollInterval of the adapter. Without it, now.", Effect::Now},
};

inline constexpr auto kEffectKeys = [] {
  std::array<Key, std::size(kSettings)> keys{};
  for (std::size_t i = 0; i < keys.size(); ++i) {
    keys[i] = Word(kSettings[i].name, kSettings[i].help, kEffects).Optional();
  }
  return keys;
}();

/// What waits in an object: some of the keys @p settings of its record, and of those below them. A key that
/// is to go is null.
constexpr std::array<Key, 2> PendingKeys(std::span<const Key> settings) {
  return {Nested("reset", "Takes effect when the adapter is reset.", settings).Partial(),
          Nested("reboot", "Takes effect when the host boots again.", settings).Partial()};
}
constexpr Key PendingKey(std::span<const Key> keys) {
  return Nested("pending", "What was set and is not in effect yet.", keys).Optional();
}

}  // namespace host

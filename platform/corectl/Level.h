/// The places of an adapter that hold session parameters and CHAP entries: itself, its sendtargets and its
/// target portals, and what each inherits.
///
/// A place below the adapter holds what was set there. All else it takes from its parent: a target portal
/// from the sendtarget through which it was found, as long as that is listed, and otherwise from the adapter;
/// a sendtarget from the adapter. What is shown and set here is what is configured: a set that is read as a
/// whole, changed and written back must not undo what waits for a reset or a reboot.
#pragma once

#include <optional>
#include <vector>

#include "corectl/Adapter.h"
#include "host/Levels.h"

namespace corectl {

// Keys of places, as texts and as the records that hold nothing else

/// HOST:PORT, with brackets around an IPv6 address.
std::string PortalText(const std::string& host, std::int64_t port);
std::string PlaceText(const TargetAddress& address);
std::string PlaceText(const StaticTarget& target);
host::Record PlaceRecord(const TargetAddress& address);
host::Record PlaceRecord(const StaticTarget& target);

constexpr host::Kind KindOf(const TargetAddress*) { return host::Kind::SendTarget; }
constexpr host::Kind KindOf(const StaticTarget*) { return host::Kind::StaticTarget; }

/// The place of that key, where the adapter has it.
template <class Key>
std::optional<host::Object> LookupPlace(host::Tree& tree, const host::Object& adapter, const Key& key) {
  return tree.Find(adapter.id, KindOf(&key), host::NameOf(KindOf(&key), PlaceRecord(key)));
}

/// As in "The adapter hba0 has no sendtarget 192.0.2.10:3260".
template <class Key>
std::string PlaceSentence(const host::Object& adapter, const char* article, const Key& key) {
  return "The adapter " + adapter.name + " has " + article + " " +
         std::string(host::GetKindSpec(KindOf(&key)).word) + " " + PlaceText(key);
}

/// The place of that key; an Error where the adapter has none.
template <class Key>
host::Object FindPlace(host::Tree& tree, const host::Object& adapter, const Key& key) {
  auto found = LookupPlace(tree, adapter, key);
  if (found) return *std::move(found);
  throw host::Error(host::Error::Kind::NotFound, PlaceSentence(adapter, "no", key) + ".");
}

/// Makes the place of that key; an Error where the adapter has it.
template <class Key>
void AddPlace(host::Tree& tree, const host::Object& adapter, const Key& key) {
  if (LookupPlace(tree, adapter, key)) {
    throw host::Error(host::Error::Kind::Exists, PlaceSentence(adapter, "the", key) + " already.");
  }
  tree.InsertNew(adapter.id, KindOf(&key), PlaceRecord(key));
}

enum class Digest { Header, Data };

/// One place, as one operation sees it. Changes are written at once.
class Level {
 public:
  Level(host::Tree& tree, const host::Object& adapter);
  Level(host::Tree& tree, const host::Object& adapter, const TargetAddress& address);
  Level(host::Tree& tree, const host::Object& adapter, const StaticTarget& target);

  iScsiParms GetParms() const;
  /// Takes over the values and marks in which @p parms differs from @p given, the record that it was made
  /// from: what another process has set in between stays. An Error, and no change, where a changed value
  /// cannot be set. Defaults, ranges and the like are not looked at.
  Status SetParms(const iScsiParms& parms, const iScsiParms& given);

  iScsiDigestType GetDigest(Digest digest) const;
  Status SetDigest(Digest digest, iScsiDigestType value);

  /// Fills in name and level of the entry that holds.
  void GetChap(iScsiChapParameters& chap, int direction) const;
  /// Stores the entry of this place; whether it is the one that holds is up to the mark in the parameters.
  /// Mutual CHAP goes with CHAP: prohibiting CHAP clears the mutual entry of the place too, and one that asks
  /// for more is refused where CHAP is prohibited.
  void SetChap(const iScsiChapParameters& chap, int direction);

 private:
  /// A parameter as it is here.
  struct Parameter {
    std::int64_t current;
    std::int64_t standard;
    bool settable;
    bool supported;
    std::int64_t least;
    std::int64_t most;
    bool inherited;
  };

  /// Adds what the place inherits from next, or the place itself.
  void Extend(const host::Object& place) { chain_.push_back(host::Configured(place)); }
  /// Writes the record of this place.
  Status Store(host::Effect effect) {
    return host::StoreConfigured(tree_, inEffect_, chain_.front().record, effect);
  }
  Status StoreParameters() { return Store(host::EffectOf(OfAdapter(), Setting::Parameters)); }

  host::Record& Own() { return chain_.front().record; }
  const host::Record& Own() const { return chain_.front().record; }
  const host::Record& OfAdapter() const { return chain_.back().record; }
  host::Inheritance Holding() const;
  bool HasParent() const { return chain_.size() > 1; }
  std::string ParentText() const;
  /// Refuses what @p subject says where the adapter lacks the capability @p own, or for a place below it
  /// @p below.
  void RequireCapability(const char* own, const char* below, const std::string& subject) const;
  /// Makes the record at @p path of this place, with its defaults, where there is none.
  void Ensure(const std::string& path);

  Parameter GetParameter(std::size_t index) const;
  void SetParameter(std::size_t index, std::int64_t value);
  /// True where a value of this place is not in effect yet as it was set, digests aside.
  bool DoesParameterWait() const;
  bool InheritsChap(const std::string& path) const;
  /// Sets the mark. Where the parent's entry no longer holds, a copy of it does until an entry is set: what
  /// was set here before it held is forgotten.
  void MarkChap(int direction, bool inherited);
  void SetEntry(const std::string& path, const std::string& name, const std::string& secret,
                std::string_view level);

  host::Tree& tree_;
  host::Object inEffect_;            // the place as it is in effect
  std::vector<host::Object> chain_;  // the place, then what it inherits from; the adapter is the last
};

/// The body of an operation on one place: @p use is handed the Level of the key, of which nothing stands for
/// the adapter. What is handed in here outlives the body.
template <class Use, class... Key>
auto OnLevel(Use use, const Key&... key) {
  return [use, &key...](host::Tree& tree, const host::Object& adapter) {
    Level level(tree, adapter, key...);
    return use(level);
  };
}

/// Refuses a CHAP name or secret that no record can hold or that has not from 1 to 255 bytes (RFC 7143
/// section 6.1 allows no longer ones), without repeating it. @p whose begins the reason: "The CHAP".
void RequireChapEntry(const std::string& name, const std::string& secret, const std::string& whose);

/// @p parms as the trace shows them: each value, or that it is inherited.
host::Argument ShownParms(const iScsiParms& parms);

}  // namespace corectl

/// An adapter as it talks to the network: ways out, the settings that hold for each portal, and logins.
#pragma once

#include <map>
#include <optional>

#include "host/Levels.h"
#include "host/Targets.h"

namespace host {

/// A network portal of the adapter. A software or dependent adapter goes out by the NICs that are bound to
/// it, an independent one by its own portal.
struct WayOut {
  std::string name;  // of the NIC or the logical portal; empty where it has none
  // Its own address of each family: empty where it has none at all, and nothing where it does not lead to
  // portals of the family.
  std::optional<std::string> ipv4 = {};
  std::optional<std::string> ipv6 = {};
};

class Initiator {
 public:
  /// An Error (WrongState) when the adapter is not online.
  Initiator(Tree& tree, const Object& adapter);

  /// Asks the portal @p sendTarget for its targets, by the first way out on which it answers.
  SendTargetsAnswer Ask(const Object& sendTarget);

  /// One session by each way out by which the target has none; where it has them all, nothing happens. Gives
  /// the target's status word: it tells of the first failure that was answered, else of the first, or of
  /// none (kDone); with kNotAsked it is not known yet.
  std::uint32_t LoginWhereMissing(KnownTarget& target);
  /// The same; but where it has them all, one session more.
  std::uint32_t LoginOnceMore(KnownTarget& target);
  /// One session more beside @p session, by the same way out.
  std::uint32_t LoginBeside(KnownTarget& target, const Object& session);

 private:
  /// A portal at which a target can be logged in to, and the levels that hold there.
  struct Place {
    Portal portal;
    Inheritance levels;
  };

  void ReadWaysOut();
  std::vector<Place> PlacesOf(const KnownTarget& target) const;
  Request RequestFor(const Inheritance& levels, const WayOut& way, const Portal& portal) const;
  std::vector<const WayOut*> WaysWithout(const std::vector<Object>& sessions) const;

  std::uint32_t LoginByEach(KnownTarget& target, const std::vector<const WayOut*>& ways);
  std::uint32_t LoginBy(KnownTarget& target, const WayOut& way);
  /// Keeps at the place, if the adapter has it, what a login has told of its portal group.
  void NoteTag(const KnownTarget& target, const Portal& portal, int tag);
  std::uint32_t LoginAt(KnownTarget& target, const WayOut& way, const Place& place);

  Tree& tree_;
  Object adapter_;
  std::map<std::string, Object> sendTargets_;
  std::vector<WayOut> ways_;
};

}  // namespace host

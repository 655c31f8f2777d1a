#include <Plinth/Checks.h>

#include <map>

#include "host/Host.h"
#include "host/Pending.h"
#include "host/Storage.h"

namespace offers {

namespace {

using Plinth::Finding;
using Plinth::FindingState;

std::vector<host::WaitingChange> ReadWaiting(host::Store& store) {
  host::Transaction transaction(store, host::Transaction::Access::Read);
  host::Tree tree(store);
  std::vector<host::WaitingChange> changes = host::WaitingChanges(tree);
  transaction.Commit();
  return changes;
}

/// A finding for each adapter, in the order of the changes.
std::vector<Finding> WaitingFindings(const std::vector<host::WaitingChange>& changes) {
  std::vector<Finding> findings;
  std::map<std::string, std::size_t> counts;
  for (const host::WaitingChange& change : changes) {
    if (counts[change.adapter]++ == 0) {
      findings.push_back({change.adapter, FindingState::Warning, "", "hcli simulator pending"});
    }
  }
  for (Finding& finding : findings) {
    const std::size_t count = counts[finding.check];
    finding.seen =
        std::to_string(count) + (count == 1 ? " change waits" : " changes wait") + " for a reset or a reboot";
  }
  return findings;
}

class HostChecks final : public Plinth::CheckSource {
 public:
  HostChecks() { Plinth::AddCheckSource(*this); }

  std::vector<Finding> Check() override { return {}; }

  std::vector<Finding> Waiting() override try {
    return WaitingFindings(ReadWaiting(host::Host::Current().GetStore()));
  } catch (const host::Error& error) {
    return {
        {"", FindingState::Fault, std::string("what waits cannot be read: ") + error.what(), "hcli doctor"}};
  }

  std::vector<Plinth::Variable> Variables() override { return {{"HCLI_ROOT"}, {"HCLI_TRACE", true}}; }
};

HostChecks checks;

}  // namespace

}  // namespace offers

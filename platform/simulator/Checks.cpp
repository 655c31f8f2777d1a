#include <Plinth/Checks.h>
#include <sys/stat.h>

#include "host/Host.h"
#include "host/Pending.h"
#include "host/Storage.h"
#include "simulator/Description.h"
#include "store/Tables.h"

namespace simulator {

namespace {

using Plinth::Finding;
using Plinth::FindingState;

/// Everything that is stored, read and held against what a description can have.
class DescriptionChecks final : public Plinth::CheckSource {
 public:
  DescriptionChecks() { Plinth::AddCheckSource(*this); }

  std::vector<Finding> Check() override {
    description_.clear();
    try {
      const std::string path = host::Host::DatabasePath();
      struct stat status;
      if (stat(path.c_str(), &status) != 0) return {};  // there is no host yet
      host::Store store(path, host::Store::Use::Look);
      if (!store::CheckVersion(store)) return {};
      host::Transaction transaction(store, host::Transaction::Access::Read);
      host::Tree tree(store);
      description_ = ShowDescription(tree, false);
      pending_ = PendingText(tree);
      transaction.Commit();
    } catch (const host::Error& error) {
      // What keeps the file from being read is told by who looks at the file.
      if (error.GetKind() != host::Error::Kind::Damaged) return {};
      return {{"host objects", FindingState::Fault,
               std::string("The host cannot be described: ") + error.what() + ".",
               "Put a copy of the database back that was kept."}};
    }
    return {{"host objects", FindingState::Ok, "All of them make sense.", ""}};
  }

  std::vector<Plinth::Enclosure> Describe() override {
    return {{"description of the host", description_}, {"changes that wait", pending_}};
  }

 private:
  static std::string PendingText(host::Tree& tree) {
    std::string text;
    for (const host::WaitingChange& change : host::WaitingChanges(tree)) {
      text += change.adapter + ' ' + change.place + ' ' + change.setting + ": " + change.from + " -> " +
              change.to + " (" + std::string(host::kEffects[static_cast<std::size_t>(change.effect)]) + ")\n";
    }
    return text;
  }

  std::string description_;
  std::string pending_;
};

DescriptionChecks checks;

}  // namespace

}  // namespace simulator

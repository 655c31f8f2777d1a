#include <Plinth/Checks.h>

#include <map>
#include <optional>

#include "host/Adapters.h"
#include "host/Formats.h"
#include "host/Host.h"
#include "host/InitiatorNameFile.h"
#include "host/Pending.h"
#include "host/Platform.h"
#include "host/Storage.h"
#include "offers/HostFiles.h"
#include "store/Tables.h"

namespace offers {

namespace {

using Plinth::Finding;
using Plinth::FindingState;

constexpr const char* kContents = "host database";
constexpr const char* kNameFile = "initiator name file";

/// What is done in one reading transaction.
template <class Work>
auto Read(host::Store& store, Work work) {
  host::Transaction transaction(store, host::Transaction::Access::Read);
  host::Tree tree(store);
  auto result = work(tree);
  transaction.Commit();
  return result;
}

/// A finding for each adapter, in the order of the changes.
Findings WaitingFindings(const std::vector<host::WaitingChange>& changes) {
  Findings findings;
  std::map<std::string, std::size_t> counts;
  for (const host::WaitingChange& change : changes) {
    if (counts[change.adapter]++ == 0) {
      findings.push_back(
          {change.adapter, FindingState::Warning, "", host::Platform::Current().WaitingCommand()});
    }
  }
  for (Finding& finding : findings) {
    const std::size_t count = counts[finding.check];
    finding.seen =
        std::to_string(count) + (count == 1 ? " change waits" : " changes wait") + " for a reset or a reboot";
  }
  return findings;
}

std::string MendOf(const host::Error& error, const std::string& path) {
  switch (error.GetKind()) {
    case host::Error::Kind::Busy:
      return "Wait for that process to end.";
    case host::Error::Kind::NotSupported:
      return "Use the newer hcli that wrote it.";
    case host::Error::Kind::Damaged:
    case host::Error::Kind::DamagedFile:
      return "Put a copy back that was kept; or, for a new host: mv " + path + " " + path + ".damaged";
    default:
      return "ls -l " + path;
  }
}

/// The name that the software initiator's adapter has; nothing where there is none.
std::optional<std::string> SoftwareName(host::Tree& tree) {
  for (const host::Object& adapter : host::IscsiAdapters(tree)) {
    if (adapter.record.GetString("kind") != "software") continue;
    return host::Configured(adapter).record.GetString("initiatorName");
  }
  return {};
}

/// Returns SoftwareName, where the database could be read.
std::optional<std::string> CheckContents(const std::string& path, Findings& findings) try {
  host::Store store(path, host::Store::Use::Look);
  if (!store::CheckVersion(store)) {
    findings.push_back({kContents, FindingState::Ok,
                        path + " belongs to an earlier version: the next command converts it.", ""});
    return {};
  }
  store.CheckStructure();
  auto name = Read(store, SoftwareName);
  findings.push_back({kContents, FindingState::Ok, path + " is sound.", ""});
  return name;
} catch (const host::Error& error) {
  std::string text = error.what();
  if (error.GetKind() == host::Error::Kind::Damaged)
    text = "The host database " + path + " is damaged: " + text + ".";
  findings.push_back({kContents, FindingState::Fault, text, MendOf(error, path)});
  return {};
}

/// @p softwareName as SoftwareName.
void CheckNameFile(const std::optional<std::string>& softwareName, Findings& findings) try {
  const std::string path = host::InitiatorNameFile();
  const std::optional<std::string> name = host::ConfiguredInitiatorName();
  const std::string set = "Set the initiator's name anew, or mend the file.";
  if (!name) {
    findings.push_back(
        {kNameFile, FindingState::Ok, path + " has no name; the initiator keeps its own.", ""});
  } else if (const std::string fault = host::IscsiNameFault(*name); !fault.empty()) {
    findings.push_back({kNameFile, FindingState::Fault,
                        path + " has " + host::Quoted(*name) + ", which is no iSCSI name: " + fault + ".",
                        set});
  } else if (softwareName && *softwareName != *name) {
    findings.push_back({kNameFile, FindingState::Warning,
                        path + " has " + host::Quoted(*name) + ", and the software initiator is " +
                            host::Quoted(*softwareName) + ".",
                        set});
  } else {
    findings.push_back({kNameFile, FindingState::Ok, path + " has " + host::Quoted(*name) + ".", ""});
  }
} catch (const host::Error& error) {
  findings.push_back({kNameFile, FindingState::Fault, error.what(), "ls -l " + host::InitiatorNameFile()});
}

class HostChecks final : public Plinth::CheckSource {
 public:
  HostChecks() { Plinth::AddCheckSource(*this); }

  Findings Check() override {
    Findings findings;
    std::string path;
    try {
      path = host::Host::DatabasePath();
    } catch (const host::Error& error) {
      return {{"host folder", FindingState::Fault, error.what(), "unset HCLI_ROOT"}};
    }
    CheckFolder(path, findings);
    std::optional<std::string> name;
    if (CheckFile(path, findings)) name = CheckContents(path, findings);
    CheckNameFile(name, findings);
    return findings;
  }

  Findings Waiting() override try {
    return WaitingFindings(Read(host::Host::Current().GetStore(), host::WaitingChanges));
  } catch (const host::Error& error) {
    return {
        {"", FindingState::Fault, std::string("what waits cannot be read: ") + error.what(), "hcli doctor"}};
  }

  std::vector<Plinth::Variable> Variables() override { return {{"HCLI_ROOT", true}, {"HCLI_TRACE", true}}; }
};

HostChecks checks;

}  // namespace

}  // namespace offers

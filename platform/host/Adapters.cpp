#include "host/Adapters.h"

#include "host/Formats.h"

namespace host {

bool DoesSoftwareWork(const Record& root) {
  return root.GetBool("softwareIscsi/enabled") || root.GetBool("softwareIscsi/rebootPending");
}

bool IsIscsi(const Object& adapter) { return adapter.record.GetString("kind") != "scsi"; }

bool IsPresent(Tree& tree, const Object& adapter) {
  return adapter.record.GetString("kind") != "software" ||
         DoesSoftwareWork(tree.Get(kRoot, Kind::Host).record);
}

std::vector<Object> IscsiAdapters(Tree& tree) {
  std::vector<Object> adapters = tree.Children(kRoot, Kind::Adapter);
  std::erase_if(adapters,
                [&](const Object& adapter) { return !IsIscsi(adapter) || !IsPresent(tree, adapter); });
  return adapters;
}

std::string_view LackedFor(const Record& adapter, const std::string& host) {
  if (ParseIpv4(host)) return {};
  const std::string_view capability = ParseIpv6(host) ? "IPv6 Supported" : "DNS Based Address Supported";
  return adapter.GetBool("capabilities/" + std::string(capability)) ? std::string_view() : capability;
}

}  // namespace host

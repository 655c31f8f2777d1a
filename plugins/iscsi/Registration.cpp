/// The entry point, and the tree that it builds: one line a node.
#include "Registration.h"

#include <iterator>
#include <string_view>

namespace TessaroCli::IscsiNamespace {
namespace {

using Plinth::AutoCli::Namespace;

/// A node by its path. A command makes itself, a namespace has its description here.
struct Node {
  std::string_view path;
  const char* description;
  NodePtr (*make)() = nullptr;

  constexpr std::string_view Name() const { return path.substr(path.rfind(' ') + 1); }
  /// The path of the namespace that it stands in; empty for the root.
  constexpr std::string_view Parent() const {
    const std::size_t blank = path.rfind(' ');
    return blank == path.npos ? std::string_view() : path.substr(0, blank);
  }
  constexpr bool IsNamespace() const { return description != nullptr; }
};

template <class CommandClass>
constexpr Node Command(std::string_view path) {
  return {path, nullptr, Make<CommandClass>};
}

}  // namespace

/// A namespace stands ahead of its children, and siblings stand in the order in which they are shown. A class
/// is declared where it is named, and this stands in no unnamed namespace, as the classes are those of other
/// files: a name that none of them has stays undefined when the plug-in is linked.
static constexpr Node kTree[] = {
    {"iscsi", "Tessaro iSCSI commands."},
    {"iscsi plugin", "Operations that can be performed on iSCSI management plugins"},
    Command<class PluginList>("iscsi plugin list"),
    {"iscsi software", "Operations that can be performed on software iSCSI"},
    Command<class SoftwareGet>("iscsi software get"),
    Command<class SoftwareSet>("iscsi software set"),
    {"iscsi adapter", "Operations that can be performed on iSCSI adapters"},
    Command<class AdapterList>("iscsi adapter list"),
    Command<class AdapterGet>("iscsi adapter get"),
    Command<class AdapterSet>("iscsi adapter set"),
    {"iscsi adapter param", "Operations that can be performed on iSCSI adapter parameters"},
    Command<class AdapterParamGet>("iscsi adapter param get"),
    Command<class AdapterParamSet>("iscsi adapter param set"),
    {"iscsi adapter capabilities", "Operations that can be performed on iSCSI adapter capabilities"},
    Command<class AdapterCapabilitiesGet>("iscsi adapter capabilities get"),
    {"iscsi adapter auth", "Operations that can be performed on iSCSI adapter authentications"},
    {"iscsi adapter auth chap", "Operations that can be performed on iSCSI adapter CHAP authentication"},
    Command<class AdapterAuthChapGet>("iscsi adapter auth chap get"),
    Command<class AdapterAuthChapSet>("iscsi adapter auth chap set"),
    {"iscsi adapter firmware", "Operations that can be performed on iSCSI adapter firmware"},
    Command<class AdapterFirmwareGet>("iscsi adapter firmware get"),
    Command<class AdapterFirmwareSet>("iscsi adapter firmware set"),
    {"iscsi adapter discovery", "Operations that can be performed on iSCSI adapter discovery"},
    Command<class AdapterDiscoveryRediscover>("iscsi adapter discovery rediscover"),
    {"iscsi adapter discovery status", "Operations that can be performed on iSCSI adapter discovery status"},
    Command<class AdapterDiscoveryStatusGet>("iscsi adapter discovery status get"),
    {"iscsi adapter discovery sendtarget", "Operations that can be performed on iSCSI sendtargets discovery"},
    Command<class AdapterDiscoverySendtargetList>("iscsi adapter discovery sendtarget list"),
    Command<class AdapterDiscoverySendtargetAdd>("iscsi adapter discovery sendtarget add"),
    Command<class AdapterDiscoverySendtargetRemove>("iscsi adapter discovery sendtarget remove"),
    {"iscsi adapter discovery sendtarget auth",
     "Operations that can be performed on iSCSI sendtarget's authentications"},
    {"iscsi adapter discovery sendtarget auth chap",
     "Operations that can be performed on iSCSI sendtarget's CHAP authentication"},
    Command<class AdapterDiscoverySendtargetAuthChapGet>("iscsi adapter discovery sendtarget auth chap get"),
    Command<class AdapterDiscoverySendtargetAuthChapSet>("iscsi adapter discovery sendtarget auth chap set"),
    {"iscsi adapter discovery sendtarget param",
     "Operations that can be performed on iSCSI sendtarget's parameters"},
    Command<class AdapterDiscoverySendtargetParamGet>("iscsi adapter discovery sendtarget param get"),
    Command<class AdapterDiscoverySendtargetParamSet>("iscsi adapter discovery sendtarget param set"),
    {"iscsi adapter discovery statictarget",
     "Operations that can be performed on iSCSI statictarget discovery"},
    Command<class AdapterDiscoveryStatictargetList>("iscsi adapter discovery statictarget list"),
    Command<class AdapterDiscoveryStatictargetAdd>("iscsi adapter discovery statictarget add"),
    Command<class AdapterDiscoveryStatictargetRemove>("iscsi adapter discovery statictarget remove"),
    {"iscsi adapter target", "Operations that can be performed on iSCSI targets"},
    Command<class AdapterTargetList>("iscsi adapter target list"),
    {"iscsi adapter target portal", "Operations that can be performed on iSCSI target portal"},
    Command<class AdapterTargetPortalList>("iscsi adapter target portal list"),
    {"iscsi adapter target portal param",
     "Operations that can be performed on iSCSI target portal parameters"},
    Command<class AdapterTargetPortalParamGet>("iscsi adapter target portal param get"),
    Command<class AdapterTargetPortalParamSet>("iscsi adapter target portal param set"),
    {"iscsi adapter target portal auth",
     "Operations that can be performed on iSCSI target portal authentications"},
    {"iscsi adapter target portal auth chap",
     "Operations that can be performed on iSCSI target portal CHAP authentications"},
    Command<class AdapterTargetPortalAuthChapGet>("iscsi adapter target portal auth chap get"),
    Command<class AdapterTargetPortalAuthChapSet>("iscsi adapter target portal auth chap set"),
    {"iscsi session", "Operations that can be performed on iSCSI sessions"},
    Command<class SessionList>("iscsi session list"),
    Command<class SessionAdd>("iscsi session add"),
    Command<class SessionRemove>("iscsi session remove"),
    {"iscsi session connection", "Operations that can be performed on iSCSI connections"},
    Command<class SessionConnectionList>("iscsi session connection list"),
    {"iscsi logicalnetworkportal",
     "Operations that can be performed on iSCSI Logical Network Portal (hostnic)"},
    Command<class LogicalNetworkPortalList>("iscsi logicalnetworkportal list"),
    {"iscsi physicalnetworkportal",
     "Operations that can be performed on iSCSI Physical Network Portal (phynic)"},
    Command<class PhysicalNetworkPortalList>("iscsi physicalnetworkportal list"),
    {"iscsi physicalnetworkportal param",
     "Operations that can be performed on iSCSI Physical Network Portal (phynic)'s parameters"},
    Command<class PhysicalNetworkPortalParamGet>("iscsi physicalnetworkportal param get"),
    Command<class PhysicalNetworkPortalParamSet>("iscsi physicalnetworkportal param set"),
    {"iscsi networkportal", "Operations that can be performed on iSCSI Network Portal (iSCSI hostnic)"},
    Command<class NetworkPortalList>("iscsi networkportal list"),
    Command<class NetworkPortalAdd>("iscsi networkportal add"),
    Command<class NetworkPortalRemove>("iscsi networkportal remove"),
    {"iscsi networkportal ipconfig",
     "Operations that can be performed on iSCSI Network Portal (iSCSI hostnic)'s IPv4 configuration. It also "
     "includes operations pertaining to DNS configuration."},
    Command<class NetworkPortalIpconfigGet>("iscsi networkportal ipconfig get"),
    Command<class NetworkPortalIpconfigSet>("iscsi networkportal ipconfig set"),
    {"iscsi networkportal ipv6config",
     "Operations that can be performed on iSCSI Network Portal (iSCSI hostnic)'s IPv6 configuration."},
    Command<class NetworkPortalIpv6configGet>("iscsi networkportal ipv6config get"),
    Command<class NetworkPortalIpv6configSet>("iscsi networkportal ipv6config set"),
    {"iscsi networkportal ipv6config address",
     "Commands to list and update IPv6 addresses assigned to the network portal."},
    Command<class NetworkPortalIpv6configAddressAdd>("iscsi networkportal ipv6config address add"),
    Command<class NetworkPortalIpv6configAddressList>("iscsi networkportal ipv6config address list"),
    Command<class NetworkPortalIpv6configAddressRemove>("iscsi networkportal ipv6config address remove"),
    {"iscsi ibftboot", "Operations that can be performed on iSCSI IBFT boot table"},
    Command<class IbftBootGet>("iscsi ibftboot get"),
    Command<class IbftBootImport>("iscsi ibftboot import"),
};

namespace {

/// Moves @p next behind the node there and all that stands in it.
constexpr void Pass(const Node*& next) {
  const Node& node = *next++;
  while (node.IsNamespace() && next != std::end(kTree) && next->Parent() == node.path) Pass(next);
}

constexpr bool IsOneTree() {
  const Node* next = std::begin(kTree);
  Pass(next);
  return next == std::end(kTree);
}
static_assert(IsOneTree(), "a path does not begin with that of the namespace that it stands in");

/// Makes the node at @p next with everything below it, and moves @p next behind them.
NodePtr Build(const Node*& next) {
  const Node& node = *next++;
  if (!node.IsNamespace()) return node.make();
  const auto made = Namespace::New();
  made->SetDescription(node.description);
  while (next != std::end(kTree) && next->Parent() == node.path) {
    const std::string name(next->Name());
    const NodePtr child = Build(next);
    made->RegisterNamespaceNode(child, name);
  }
  return made;
}

}  // namespace
}  // namespace TessaroCli::IscsiNamespace

// The framework looks this one up by its plain name.
extern "C" __attribute__((visibility("default"))) void AutoCli_RegisterNamespaces(
    boost::shared_ptr<Plinth::AutoCli::Namespace> parent) {
  using namespace TessaroCli::IscsiNamespace;
  const Node* next = std::begin(kTree);
  const NodePtr root = Build(next);
  parent->RegisterNamespaceNode(root, std::string(kTree[0].Name()));
}

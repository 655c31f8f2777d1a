#include "support/SweepTable.h"

#include <nlohmann/json.hpp>
#include <regex>

#include "UnregisteredCommands.h"
#include "host/Schema.h"
#include "support/ProjectFile.h"

namespace sweep {

namespace {

using namespace TessaroCli::IscsiNamespace;
using Text = std::string;

constexpr char kUnknownAdapter[] = "Invalid adapter specified or unable to get adapter.";
const Text kRange =
    "Please make sure parameter input is settable and within MAX/MIN range (integer takes numbers, bool "
    "takes [true/false,yes/no,y/n]).";
const Text kUnsetParms = "Unable to set parameters. " + kRange +
                         " Digests will take {prohibited, discouraged, preferred, required} only.";
constexpr char kNoParms[] = "Failed to get parameter configuration.";
constexpr char kNoIsnsParms[] = "%REASON% | Failed to get iSNS parameter configuration.";

// What walks over adapters, targets and sessions report, with a bar behind for the texts of further calls.
const Text kWalk =
    "IMA_GetLhbaOidList: Unable to get logical adapter list. | "
    "IMA_GetLhbaProperties: Unable to get logical adapter properties. | ";
const Text kTargetWalk = kWalk +
                         "IMA_GetTargetOidList: Unable to get target list. | "
                         "IMA_GetTargetProperties: Unable to get logical adapter properties. | ";

/// Of a command that changes what the options select, where @p change fails.
Text Selection(const Text& change) {
  Text texts = change;
  for (const char* text : {"IMA_GetLhbaOidList: Unable to get logical adapter list.",
                           "IMA_GetLhbaProperties: Unable to get logical adapter properties.",
                           "IMA_GetTargetOidList: Unable to get target list.",
                           "IMA_GetTargetProperties: Unable to get target properties.",
                           "IMA_GetSessionOidList: Unable to get session list.",
                           "IMA_GetSessionProperties: Unable to get session properties."}) {
    const Text call = text;
    texts += " | " + call + " | " + call.substr(0, call.find(':')) + ": Failed to find matching object.";
  }
  return texts;
}

const Text kFirmware =
    "IMA_GetPhbaOidList: Unable to get physical adapter list. | "
    "IMA_TSR_GetLhbaOidList: Unable to get logical adapter list. | "
    "IMA_GetLhbaProperties: Unable to get logical adapter list. | "
    "IMA_GetPhbaDownloadProperties: No download properties. | "
    "IMA_PhbaDownload: Firmware download failed. | IMA_IsPhbaDownloadFile: ";
const Text kRoute =
    "IMA_GetLhbaOidList: Invalid adapter specified or unable to get adapter. | "
    "IMA_GetLhbaProperties: Invalid adapter specified or unable to get adapter. | "
    "IMA_TSR_GetRouteOidList: Operation not supported for this adapter. | "
    "IMA_TSR_GetRouteProperties: Operation not supported for this adapter. | "
    "IMA_TSR_GetNetworkPortalOidList: Operation not supported for this adapter. | "
    "IMA_GetNetworkPortalProperties: Operation not supported for this adapter. | "
    "IMA_TSR_GetLnpProperties: Operation not supported for this adapter. | "
    "IMA_TSR_AddRoute: Add route failed. | IMA_TSR_AssociateRoute: Associate route failed. | "
    "IMA_TSR_DisassociateRoute: Disassociate route failed. | IMA_TSR_RemoveRoute: Remove route failed.";

constexpr char kAdapter[] = "-A ind";
constexpr char kSendTarget[] = "-A ind -a 192.0.2.31";
constexpr char kPortal[] = "-A ind -n iqn.2026-11.org.example:fixed -a 192.0.2.41";
constexpr char kServer[] = "-A ind -m static -a 192.0.2.60";
constexpr char kTarget[] = "-A ind -n iqn.2026-11.org.example:vault";
const Text kSession = "-A ind -n iqn.2026-11.org.example:vault -s 80107e020001";

Text ChapLines(const Text& place) {
  const Text entry = place + " --authname user --secret s3cr3t-option --level required";
  const Text lines = entry + " | " + entry + " -d mutual | " + place + " --default";
  return place == kAdapter ? lines : lines + " | " + place + " --inherit -d mutual";
}
Text ParmLines(const Text& place) {
  return place + " -k MaxCmds -v 64 | " + place + " -k HeaderDigest -v required | " + place +
         " -k DataDigest --default" + (place == kAdapter ? "" : " | " + place + " -k MaxCmds --inherit");
}

struct ExceptionToTheRule {
  std::string_view command;    ///< a part of its name
  std::string_view operation;  ///< empty for every call
  std::string_view thrown;     ///< empty for every failure
  Behind behind;
};

constexpr ExceptionToTheRule kExceptions[] = {
    // A listing of adapters that answers for as many as it can.
    {"physicalnetworkportal list", "GetPhysicalNetworkPortals", "", Behind::GoesOn},
    // An adapter with a network stack of its own may lack these calls.
    {"logicalnetworkportal list", "GetLogicalNetworkPortals", "", Behind::AsksKind},
    {"logicalnetworkportal list", "GetNicProperties", "", Behind::AsksKind},
    {"networkportal list", "GetiScsiBoundNicListWithPathStatus", "", Behind::AsksKind},
    {"networkportal ipconfig get", "GetLogicalNetworkPortals", "", Behind::AsksKind},
    // "na" stands in the row.
    {"adapter target list", "IMA_TSR_GetInternalConfigData", "", Behind::GoesOn},
    {"adapter discovery statictarget list", "IMA_TSR_GetInternalConfigData", "", Behind::GoesOn},
    // An adapter that cannot tell its routes has none to show.
    {"RouteList", "IMA_TSR_GetRouteOidList", "", Behind::GoesOn},
    // What was found is shown in any case.
    {"plugin list", "", "", Behind::KeepsRows},
    // An entry without a portal must not stay.
    {"RouteAdd", "IMA_TSR_AssociateRoute", "", Behind::TakesBack},
    // Built on statuses alone, it has no handler for what this helper throws.
    {"adapter discovery statictarget list", "ConvertHostAddress", "", Behind::ToFramework},
};

}  // namespace

const std::vector<SweptCommand>& Commands() {
  using enum Statuses;
  static const std::vector<SweptCommand> commands = {
      {"plugin list", "| -p libsecond.so | -A ind",
       kWalk + "IMA_GetPluginOidList: Unable to get plugin list. | "
               "IMA_GetPluginProperties: Unable to get plugin properties. | "
               "IMA_GetAssociatedPluginOid: Unable to get plugin identifier."},
      {"software get", "", "Unable to get Software iSCSI information."},
      {"software set", "--enabled=true | --enabled=true --name iqn.2026-11.org.example:new",
       "Failed to enable software iSCSI: %REASON%"},
      {"software set", "--enabled=false", "Failed to disable software iSCSI: %REASON%"},
      {"adapter list", "| -A ind", "Unable to list adapters."},
      {"adapter get", "-A ind | -A soft", "Unable to get adapter information."},
      {"adapter set", "-A ind -n iqn.2026-11.org.example:one -a lab | -A soft -a lab",
       "Unable to set name or alias.", nullptr, Shown},
      {"adapter param get", kAdapter, kNoParms},
      {"adapter param set", ParmLines(kAdapter), kUnsetParms, nullptr, Shown},
      {"adapter capabilities get", "-A ind | -A dep", "Unable to get adapter properties."},
      {"adapter auth chap get", "-A ind | -A ind -d mutual",
       "Failed to get iSCSI CHAP authentication configuration."},
      {"adapter auth chap set", ChapLines(kAdapter),
       "Failed to set iSCSI CHAP authentication configuration."},
      {"adapter firmware get", "-A ind -f FILE", kFirmware + "Invalid file provided."},
      {"adapter firmware set", "-A ind -f FILE", kFirmware + "Invalid download file provided."},
      {"adapter discovery rediscover", kAdapter, "Unable to discover targets."},
      {"adapter discovery status get", kAdapter, "Unable to get discovery status."},
      {"adapter discovery sendtarget list", "| -A ind", "Failed to list sendtargets."},
      {"adapter discovery sendtarget add", "-A ind -a 192.0.2.99",
       "%REASON% | Unable to add sendtarget address."},
      {"adapter discovery sendtarget remove", kSendTarget, "%REASON% | Failed to remove sendtarget."},
      {"adapter discovery sendtarget auth chap get", "-A ind -a 192.0.2.31 | -A ind -a 192.0.2.31 -d mutual",
       "Failed to get iSCSI CHAP authentication configuration."},
      {"adapter discovery sendtarget auth chap set", ChapLines(kSendTarget),
       "Failed to set CHAP authentication configuration."},
      {"adapter discovery sendtarget param get", kSendTarget, kNoParms},
      {"adapter discovery sendtarget param set", ParmLines(kSendTarget), kUnsetParms},
      {"adapter discovery statictarget list", "| -A ind",
       kWalk + "IMA_GetStaticDiscoveryTargetOidList: Unable to get static target list. | "
               "IMA_GetStaticDiscoveryTargetProperties: Unable to get logical adapter properties."},
      {"adapter discovery statictarget add", "-A ind -n iqn.2026-11.org.example:more -a 192.0.2.98",
       "%REASON% | Failed to add static target."},
      {"adapter discovery statictarget remove", kPortal, "%REASON% | Failed to remove static target."},
      {"adapter target list", Text("| ") + kTarget, kTargetWalk},
      {"adapter target portal list", Text("| ") + kTarget,
       kTargetWalk + "IMA_GetAddressKeys: Unable to get address keys."},
      {"adapter target portal param get", Text(kPortal) + " | -A ind -n all -a all", kNoParms},
      {"adapter target portal param set", ParmLines(kPortal), kUnsetParms},
      {"adapter target portal auth chap get", Text(kPortal) + " | -A ind -n all -a all -d mutual -m chap",
       "Failed to get CHAP authentication configuration."},
      {"adapter target portal auth chap set", ChapLines(kPortal), "Unable to set CHAP authentication."},
      {"session list", "| " + kSession,
       kTargetWalk + "IMA_GetSessionOidList: Unable to get target list. | "
                     "IMA_GetSessionProperties: Feature not supported by this adapters."},
      {"session add", Text("-A soft | ") + kTarget + " | " + kSession,
       Selection("IMA_TSR_AddSession: Failed to add session.")},
      {"session remove", Text("-A ind | ") + kTarget + " | " + kSession,
       Selection("IMA_TSR_RemoveSession: Failed to remove session.")},
      {"session connection list", "| " + kSession + " -c 0",
       kTargetWalk + "IMA_GetSessionOidList: Unable to get session list. | "
                     "IMA_GetSessionProperties: Unable to get logical adapter properties. | "
                     "IMA_GetConnectionOidList: Unable to get connection list. | "
                     "IMA_GetConnectionProperties: Unable to get connection properties. | "
                     "IMA_TSR_GetConnectionStatus: Unable to get connection status."},
      {"logicalnetworkportal list", "| -A ind", "Failed to list logical network portals."},
      {"physicalnetworkportal list", "| -A ind", "Failed to list physical network portals."},
      {"physicalnetworkportal param get", "-A ind | -A ind -n phy0",
       "Failed to get parameters on physical network portal."},
      {"physicalnetworkportal param set", "-A ind -o MTU -v 9000 | -A ind -o ArpRedirect -v 1",
       "Failed to set parameter for physical network portal.", nullptr, Shown},
      {"networkportal list", "| -A soft", "Failed to list network portals."},
      {"networkportal add", "-A soft -n nic2", "Unable to bind iscsi port. [force = 0]\n"},
      {"networkportal add", "-A soft -n nic2 -f true", "Unable to bind iscsi port. [force = 1]\n"},
      {"networkportal remove", "-A soft -n nic1 | -A soft -n nic1 -f true", "Unable to unbind iscsi port."},
      {"networkportal ipconfig get", "-A ind | -A soft -n nic1",
       "Failed to get IP configuration for network portal. | %REASON%"},
      {"networkportal ipconfig set",
       "-A ind -e true -i 192.0.2.77 -s 255.255.255.128 -g 192.0.2.2 -x 192.0.2.3 -y 192.0.2.4 | "
       "-A ind -e true -d true | -A ind -e false",
       "Failed to set IP configuration on network portal. | %REASON%", nullptr, Gathered},
      {"networkportal ipv6config get", kAdapter,
       "Failed to get IP configuration for network portal. | %REASON%"},
      {"networkportal ipv6config set",
       "-A ind -e true -d true -l true -r true -g 2001:db8:2::9 | -A ind -e false",
       "Failed to set IPv6 configuration on network portal. | %REASON%", nullptr, Gathered},
      {"networkportal ipv6config address add",
       "-A ind -a 2001:db8:3::5/64 -a 2001:db8:3::6/64 -r | -A ind -a 2001:db8:3::7/64 | -A ind -r",
       "Error adding IPv6 address list on network portal | %REASON%", nullptr, Gathered},
      {"networkportal ipv6config address list", kAdapter, "Unable to list IPv6 Addresses. | %REASON%"},
      {"networkportal ipv6config address remove", "-A ind -a 2001:db8:2::20/64 -a 2001:db8:2::21/64",
       "Error removing IPv6 address on network portal. | %REASON%", nullptr, Gathered},
      {"ibftboot get", "", "Unable to get boot tables."},
      {"ibftboot import", "", "Unable to import IBFT Boot table."},

      {"AdapterDiscoveryIsnsAdd", "-A ind -m static -a 192.0.2.97",
       "%REASON% | Unable to add iSNS discovery address.", AdapterDiscoveryIsnsAdd::New},
      {"AdapterDiscoveryIsnsList", "| -A ind", "%REASON% | Failed to list isns discovery addresses.",
       AdapterDiscoveryIsnsList::New},
      {"AdapterDiscoveryIsnsParamGet", kServer, kNoIsnsParms, AdapterDiscoveryIsnsParamGet::New},
      {"AdapterDiscoveryIsnsParamSet",
       Text(kServer) + " -k PollInterval -v 60 | " + kServer + " -k PollInterval --inherit | " + kServer +
           " -k PollInterval --default",
       "%REASON% | Unable to set isns parameters. " + kRange, AdapterDiscoveryIsnsParamSet::New},
      {"AdapterDiscoveryIsnsRemove", kServer, "%REASON% | Unable to remove iSNS discovery address.",
       AdapterDiscoveryIsnsRemove::New},
      {"AdapterIsnsParamGet", kAdapter, kNoIsnsParms, AdapterIsnsParamGet::New},
      {"AdapterIsnsParamSet", "-A ind -k PollInterval -v 60 | -A ind -k PollInterval --default",
       "%REASON% | Unable to set iSNS parameters. " + kRange, AdapterIsnsParamSet::New, Shown},
      {"RouteAdd", "-A ind -s 203.0.113.0/24 -g 192.0.2.1 -n port0", kRoute, RouteAdd::New},
      {"RouteList", "| -A ind -n port0", kRoute, RouteList::New},
      {"RouteRemove", "-A ind -s 198.51.100.0/24 -g 192.0.2.1 -n port0", kRoute, RouteRemove::New},
  };
  return commands;
}

Texts Parts(const std::string& text) {
  static const std::regex kBar(" *\\| *");
  const std::string closed = text + '|';
  return {std::sregex_token_iterator(closed.begin(), closed.end(), kBar, -1), {}};
}

Texts ReportsOf(const SweptCommand& command, const std::string& operation) {
  if (operation == "GetScsiInterface") return {kUnknownAdapter};
  const bool isIma = operation.starts_with("IMA_");
  Texts reports;
  for (std::string text : Parts(command.reports)) {
    if (text.empty() || text.starts_with(isIma ? operation + ": " : "IMA_") != isIma) continue;
    if (isIma) text.erase(0, operation.size() + 2);
    reports.push_back(std::regex_replace(text, std::regex("%REASON%"), kReason));
  }
  return reports;
}

Behind BehindOf(const SweptCommand& command, const std::string& operation, const std::string& thrown) {
  for (const ExceptionToTheRule& one : kExceptions) {
    const bool fits = command.name.find(one.command) != command.name.npos &&
                      (one.operation.empty() || operation == one.operation) &&
                      (one.thrown.empty() || thrown == one.thrown);
    if (fits) return one.behind;
  }
  return Behind::TheRule;
}

std::string HostDescription() {
  nlohmann::json host = nlohmann::json::parse(FileText("tests/support/host.json"));
  for (nlohmann::json& adapter : host["adapters"]) {
    if (adapter["kind"] == "scsi" || adapter.contains("capabilities")) continue;
    for (const std::string_view capability : ::host::kCapabilities) {
      adapter["capabilities"][std::string(capability)] = true;
    }
  }
  return host.dump();
}

}  // namespace sweep

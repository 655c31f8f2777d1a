/// The names of all library operations: the one list that the trace, the answers and the libraries go by.
#pragma once

#include <cstdint>
#include <string_view>

namespace host {

/// What an operation gives, which decides how a description can have it answered.
enum class Gives : std::uint8_t { Value, Status, Ima };

struct OperationSpec {
  std::string_view name;
  Gives gives;
};

inline constexpr OperationSpec kOperations[] = {
    // StorageInfoImpl and the helpers without an adapter
    {"GetScsiInterface", Gives::Value},
    {"GetiScsiInterfaces", Gives::Value},
    {"GetiScsiBootTables", Gives::Value},
    {"GetiScsiBoundNicListWithPathStatus", Gives::Value},
    {"HasSoftwareiScsiEnabled", Gives::Value},
    {"EnableSoftwareiScsi", Gives::Value},
    {"DisableSoftwareiScsi", Gives::Value},
    {"MountiScsiBootLun", Gives::Value},
    {"CheckInitiatorName", Gives::Value},
    {"ConvertHostAddress", Gives::Value},
    {"Parse", Gives::Value},
    {"Save", Gives::Value},
    // ScsiInterface and iScsiInterface
    {"GetName", Gives::Value},
    {"GetAdapterUid", Gives::Value},
    {"GetDriverName", Gives::Value},
    {"IsSoftwareOrDependent", Gives::Value},
    {"ResetAdapter", Gives::Value},
    {"Rediscover", Gives::Value},
    {"GetDiscoveryStatus", Gives::Value},
    {"GetNicProperties", Gives::Value},
    {"GetPhysicalNetworkPortals", Gives::Value},
    {"GetLogicalNetworkPortals", Gives::Value},
    {"BindHostnic", Gives::Value},
    {"UnbindHostnic", Gives::Value},
    {"GetCapabilities", Gives::Value},
    {"GetPhysicalHbaProperties", Gives::Value},
    {"GetInitiatorName", Gives::Value},
    {"SetInitiatorName", Gives::Status},
    {"GetInitiatorAlias", Gives::Value},
    {"SetInitiatorAlias", Gives::Status},
    {"AddIsnsConfig", Gives::Value},
    {"RemoveIsnsConfig", Gives::Value},
    {"GetIsnsConfigs", Gives::Value},
    {"GetIsnsParms", Gives::Value},
    {"SetIsnsParms", Gives::Value},
    {"GetAdapterIsnsParms", Gives::Value},
    {"SetAdapterIsnsParms", Gives::Status},
    {"AddStaticTarget", Gives::Value},
    {"RemoveStaticTarget", Gives::Value},
    {"GetStaticTargets", Gives::Value},
    {"AddSendTargetAddress", Gives::Value},
    {"RemoveSendTargetAddress", Gives::Value},
    {"GetSendTargetAddresses", Gives::Value},
    {"GetNetworkProperties", Gives::Value},
    {"SetIpv4Address", Gives::Status},
    {"SetIpv4SubnetMask", Gives::Status},
    {"SetIpv4Gateway", Gives::Status},
    {"SetIpv6Gateway", Gives::Status},
    {"SetDnsServers", Gives::Status},
    {"SetIpv6Address", Gives::Status},
    {"SetIpv6ConfigMethod", Gives::Status},
    {"SetUseDhcpv4", Gives::Status},
    {"SetIpVersionEnabled", Gives::Status},
    {"GetAdapterState", Gives::Value},
    {"SetChapParameters", Gives::Value},
    {"SetTargetChapParameters", Gives::Value},
    {"SetSendTargetChapParameters", Gives::Value},
    {"GetChapParameters", Gives::Value},
    {"GetTargetChapParameters", Gives::Value},
    {"GetSendTargetChapParameters", Gives::Value},
    {"SetHeaderDigest", Gives::Status},
    {"SetTargetHeaderDigest", Gives::Status},
    {"SetSendTargetHeaderDigest", Gives::Status},
    {"GetHeaderDigest", Gives::Value},
    {"GetTargetHeaderDigest", Gives::Value},
    {"GetSendTargetHeaderDigest", Gives::Value},
    {"SetDataDigest", Gives::Status},
    {"SetTargetDataDigest", Gives::Status},
    {"SetSendTargetDataDigest", Gives::Status},
    {"GetDataDigest", Gives::Value},
    {"GetTargetDataDigest", Gives::Value},
    {"GetSendTargetDataDigest", Gives::Value},
    {"SetArpRedirect", Gives::Status},
    {"GetArpRedirect", Gives::Value},
    {"SetMtu", Gives::Status},
    {"GetMtu", Gives::Value},
    {"SetAdapterParms", Gives::Status},
    {"GetAdapterParms", Gives::Value},
    {"SetTargetParms", Gives::Status},
    {"GetTargetParms", Gives::Value},
    {"SetSendTargetParms", Gives::Status},
    {"GetSendTargetParms", Gives::Value},
    // IMA
    {"IMA_GetPluginOidList", Gives::Ima},
    {"IMA_GetPluginProperties", Gives::Ima},
    {"IMA_GetAssociatedPluginOid", Gives::Ima},
    {"IMA_GetLhbaOidList", Gives::Ima},
    {"IMA_GetLhbaProperties", Gives::Ima},
    {"IMA_GetPhbaOidList", Gives::Ima},
    {"IMA_GetPhbaDownloadProperties", Gives::Ima},
    {"IMA_IsPhbaDownloadFile", Gives::Ima},
    {"IMA_PhbaDownload", Gives::Ima},
    {"IMA_GetTargetOidList", Gives::Ima},
    {"IMA_GetTargetProperties", Gives::Ima},
    {"IMA_GetAddressKeys", Gives::Ima},
    {"IMA_GetStaticDiscoveryTargetOidList", Gives::Ima},
    {"IMA_GetStaticDiscoveryTargetProperties", Gives::Ima},
    {"IMA_GetSessionOidList", Gives::Ima},
    {"IMA_GetSessionProperties", Gives::Ima},
    {"IMA_GetConnectionOidList", Gives::Ima},
    {"IMA_GetConnectionProperties", Gives::Ima},
    {"IMA_GetNetworkPortalProperties", Gives::Ima},
    {"IMA_TSR_GetLhbaOidList", Gives::Ima},
    {"IMA_TSR_GetInternalConfigData", Gives::Ima},
    {"IMA_TSR_AddSession", Gives::Ima},
    {"IMA_TSR_RemoveSession", Gives::Ima},
    {"IMA_TSR_GetConnectionStatus", Gives::Ima},
    {"IMA_TSR_GetRouteOidList", Gives::Ima},
    {"IMA_TSR_GetRouteProperties", Gives::Ima},
    {"IMA_TSR_AddRoute", Gives::Ima},
    {"IMA_TSR_RemoveRoute", Gives::Ima},
    {"IMA_TSR_AssociateRoute", Gives::Ima},
    {"IMA_TSR_DisassociateRoute", Gives::Ima},
    {"IMA_TSR_GetNetworkPortalOidList", Gives::Ima},
    {"IMA_TSR_GetLnpProperties", Gives::Ima},
};

/// The row of @p name, or null.
constexpr const OperationSpec* FindOperation(std::string_view name) {
  for (const OperationSpec& operation : kOperations) {
    if (operation.name == name) return &operation;
  }
  return nullptr;
}

/// The name of an operation; one that is missing in the list does not compile.
class Operation {
 public:
  consteval Operation(const char* name) : spec_(Find(name)) {}
  constexpr std::string_view Name() const { return spec_.name; }
  constexpr Gives GetGives() const { return spec_.gives; }

 private:
  // By value: under the undefined behaviour sanitizer, g++ takes no comparison of a pointer for constant.
  static consteval OperationSpec Find(std::string_view name) {
    for (const OperationSpec& operation : kOperations) {
      if (operation.name == name) return operation;
    }
    throw "no such operation";
  }

  OperationSpec spec_;
};

}  // namespace host

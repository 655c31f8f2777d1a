/// The tools that the commands share. Each operation's file is named for what it does.
#pragma once

#include <CoreCtl/Storage.h>
#include <Plinth/CallSpec.h>
#include <Plinth/MetaObj.h>
#include <ima/ima.h>

#include <memory>
#include <sstream>
#include <string>

namespace IscsiUtil {

/// Operations without state. Where one throws, it throws CoreCtl::Lib::CoreCtlException.
class IscsiTools {
 public:
  IscsiTools() = delete;

  using iScsiInterface = NodeCtl::Storage::iScsiInterface;
  using iScsiStatus = iScsiInterface::iScsiStatus;

  // AdapterLookup.cpp

  /// The iSCSI adapter of that name; never null. Throws when there is none, or when it is no iSCSI adapter.
  static std::unique_ptr<iScsiInterface> GetIscsiInterface(const std::string& adapterName);
  /// Acts on the status of a change: reports a reboot or an unsupported operation, resets the adapter.
  static void ProcessStatus(iScsiInterface* interface, iScsiStatus status,
                            boost::shared_ptr<Plinth::CallSpec::Output> output);
  /// The same for one change of several: a reboot is noted in @p messages, and a reset is left to the caller,
  /// who is told to do it. @p option names the change and may be empty.
  static bool IsResetRequired(const std::string& option, iScsiStatus status,
                              std::basic_stringstream<char>& messages);

  // Conversions.cpp: words of the command line

  static std::string GetStringFromDigest(NodeCtl::Storage::iScsiDigestType digest);
  static NodeCtl::Storage::iScsiDigestType GetDigestFromString(const std::string& word);
  static std::string GetStringFromChapType(NodeCtl::Storage::iScsiChapType level);
  static NodeCtl::Storage::iScsiChapType GetChapTypeFromString(const std::string& word);
  static std::string GetStringFromImaDigest(IMA_DIGEST_TYPE digest);
  // These do not throw: a number that they do not know has a word of its own.
  static std::string ConvertExtendedBoolToString(NodeCtl::Storage::ExtendedBool value);
  static std::string GetStringFromComplianceCode(NodeCtl::Storage::iScsiPortErrorCodes code);
  static std::string GetStringFromPathStatus(NodeCtl::Storage::iScsiNetworkPortalStatus status);
  static std::string GetStringFromDiscoveryStatus(iScsiInterface::iScsiDiscoveryStatus status);

  // Conversions.cpp: addresses and wide texts of the management API; these do not throw

  /// The text of @p address in a static buffer that the next call overwrites; null when it has none.
  static const char* GetStringFromImaIpAddress(const IMA_IP_ADDRESS* address);
  /// The address in @p text in a static record that the next call overwrites; null when it is none.
  static IMA_IP_ADDRESS* GetImaIpAddressFromString(const char* text);
  /// Writes @p source as UTF-8, with its terminator, to @p destination of @p size bytes. Anything that cannot
  /// be converted or does not fit is IMA_ERROR_INVALID_PARAMETER, and @p destination stays as it was.
  static IMA_STATUS GetUtf8StringFromWideCharString(char* destination, const wchar_t* source,
                                                    unsigned int size);
  /// Sets @p destination to a copy of @p source, UTF-8, for the caller to free(). A text that cannot be
  /// converted is IMA_ERROR_INVALID_PARAMETER, and @p destination stays as it was.
  static IMA_STATUS GetWideCharStringFromUtf8String(wchar_t** destination, const char* source);

  // SessionSelection.cpp

  /// Sets @p oid to the adapter, target or session that the options `adapter`, `name` and `isid` select.
  /// False, and no object, when there is none or when it cannot be looked up; only the latter is reported.
  static bool GetSessionOidFromInput(boost::shared_ptr<Plinth::CallSpec::Input> input,
                                     boost::shared_ptr<Plinth::CallSpec::Output> output, IMA_OID* oid);

  // Addresses.cpp

  /// The portal in @p text: HOST, HOST:PORT, an IPv6 address alone, or [IPV6]:PORT. The port is 3260 where
  /// none is told.
  static NodeCtl::Storage::TargetAddress GetTargetAddressFromString(const std::string& text);
  /// The form in which a portal is shown, always with its port.
  static std::string GetStringFromTargetAddress(const NodeCtl::Storage::TargetAddress& address);
  /// A configuration without DHCP. This and the next two throw what the value classes throw.
  static NodeCtl::Network::IpConfig GetIpConfigFromString(const std::string& address,
                                                          const std::string& netmask);
  static NodeCtl::Network::Ipv4Address GetIpv4AddressFromString(const std::string& text);
  static NodeCtl::Network::Ipv6Address GetIpv6AddressFromString(const std::string& text);

  // Parameters.cpp: session parameters by their keys; a key that is not known is refused

  /// A fresh prototype of the rows of ParmFill.
  static boost::shared_ptr<Plinth::MetaObj::MetaStruct> ParmStructure();
  /// Appends a row for each parameter to @p list. Digests do not stand in @p parms: they, and whether they
  /// can be set, are handed in.
  static void ParmFill(const std::string& id, const boost::shared_ptr<Plinth::MetaObj::MetaList>& list,
                       const NodeCtl::Storage::iScsiParms& parms,
                       NodeCtl::Storage::iScsiDigestType headerDigest,
                       NodeCtl::Storage::iScsiDigestType dataDigest, bool headerSettable, bool dataSettable);
  static bool IsParmSettable(const std::string& key, const NodeCtl::Storage::iScsiParms& parms,
                             bool headerSettable, bool dataSettable);
  // These change a parameter and its inherit mark in the record; of a digest, the mark alone.

  /// A truth value is one of the words yes, y, true, 1, no, n, false, 0; any other is refused and changes
  /// nothing. A number is what strtol makes of @p value, cut to 32 bits: no digits are 0, and ranges are not
  /// looked at.
  static void ParmSet(const std::string& key, const std::string& value, NodeCtl::Storage::iScsiParms& parms);
  static void ParmInherit(const std::string& key, NodeCtl::Storage::iScsiParms& parms);
  static void ParmDefault(const std::string& key, NodeCtl::Storage::iScsiParms& parms);

  // Parameters.cpp: the same for the one parameter of iSNS discovery

  static bool IsIsnsParmSettable(const std::string& key, const NodeCtl::Storage::iSnsParms& parms);
  static void IsnsParmSet(const std::string& key, const std::string& value,
                          NodeCtl::Storage::iSnsParms& parms);
  static void IsnsParmInherit(const std::string& key, NodeCtl::Storage::iSnsParms& parms);
  static void IsnsParmDefault(const std::string& key, NodeCtl::Storage::iSnsParms& parms);

  // NetworkParameters.cpp

  /// A fresh prototype of the rows of NetParmFill.
  static boost::shared_ptr<Plinth::MetaObj::MetaStruct> NetParmStructure();
  /// Appends a row for each network parameter of the physical portal @p phynic to @p list.
  static void NetParmFill(const std::string& phynic, const boost::shared_ptr<Plinth::MetaObj::MetaList>& list,
                          const NodeCtl::Storage::iScsiCapabilities& capabilities, int mtu, bool arpRedirect);
};

}  // namespace IscsiUtil

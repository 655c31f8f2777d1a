/// The way into the storage control library.
#pragma once

#include <CoreCtl/Exception.h>
#include <NodeCtl/BootTables.h>
#include <NodeCtl/iScsiInterface.h>
#include <ima/ima.h>

#include <string>
#include <vector>

#pragma GCC visibility push(default)

namespace CoreCtl::Storage {

/// The library's class behind NodeCtl::Storage::iScsiInterface. Front ends tell an iSCSI adapter from
/// another storage adapter by casting to it at run time, and use nothing else of it.
class iScsiInterfaceImpl : public NodeCtl::Storage::iScsiInterface {
 public:
  ~iScsiInterfaceImpl() override;

 protected:
  iScsiInterfaceImpl() = default;
};

/// What a host has and does as a whole. A local object for one command, cheap to make; it opens nothing
/// until an operation is called. Operations throw NodeCtl::Lib::NodeCtlException when the library fails.
class StorageInfoImpl {
 public:
  StorageInfoImpl();
  StorageInfoImpl(const StorageInfoImpl&) = delete;
  StorageInfoImpl& operator=(const StorageInfoImpl&) = delete;
  ~StorageInfoImpl();

  /// The storage adapter @p name, iSCSI or not; null where there is none. The name is compared exactly. The
  /// caller deletes it; it stays usable without this object. To front ends every failure of this lookup, of
  /// whichever type, is an adapter that cannot be had.
  NodeCtl::Storage::ScsiInterface* GetScsiInterface(const std::string& name);
  /// All iSCSI adapters, in the host's order; none is no error. The caller deletes each element; an element
  /// may be null.
  std::vector<NodeCtl::Storage::iScsiInterface*> GetiScsiInterfaces();
  /// The boot tables of the host's firmware. A host without one is no error.
  NodeCtl::Storage::iScsiBootTables GetiScsiBootTables();
  /// Replaces the contents of @p nics by the NICs bound to the adapter @p adapter, in the adapter's order,
  /// all members filled in, compliance and path status too. Unchanged when it throws. An independent adapter
  /// without this call throws NodeCtlException with the whole text
  ///
  ///     iScsiLibException: status(80000001): Not supported; Message= IMA_TSR_GetNicProperties
  ///
  /// with which front ends compare GetDescription(0) byte by byte, to pass the adapter over; every other text
  /// fails the listing.
  void GetiScsiBoundNicListWithPathStatus(std::string adapter,
                                          std::vector<NodeCtl::Storage::iScsiNicProperties>& nics);
  /// True when the software initiator is switched on; false from DisableSoftwareiScsi on, although it works
  /// until the reboot.
  bool HasSoftwareiScsiEnabled();
  /// Switches the software initiator on, at once. Its adapter takes the initiator name that the daemon's file
  /// has under InitiatorName, if it is valid: at once too, or at the next reboot where it was on. @p probe is
  /// for the library's own use at boot: front ends pass false.
  void EnableSoftwareiScsi(bool probe);
  /// Switches the software initiator off, effective at the next reboot; no change where it is off.
  void DisableSoftwareiScsi();
  /// Adds the target of the host's primary boot table, with its CHAP entries, to every eligible dependent
  /// adapter (@p addTarget), and logs in to the target that was added (@p login, of no effect without the
  /// former). One that the adapter has already takes the CHAP entries, and where there is a session with it
  /// no other is made. Throws where no table is enabled, its contents name no target, or no adapter is
  /// eligible, with nothing changed; a login that is refused does not throw, but shows in the login status of
  /// the target.
  void MountiScsiBootLun(bool addTarget, bool login);
};

/// Helpers that need no adapter.
class iScsiUtil {
 public:
  iScsiUtil() = delete;

  /// True when @p name is a valid initiator name: UTF-8 of type iqn., eui. or naa. and at most 223 bytes
  /// (RFC 7143 section 4.2.7). Any other throws NodeCtl::Lib::NodeCtlException with a text that says what is
  /// wrong; false is never returned.
  static bool CheckInitiatorName(const std::string& name);
  /// The host in @p host: an IPv4 address, an IPv6 address or a name, which is not resolved. Throws
  /// NodeCtl::Lib::NodeCtlException when it is none of them.
  static NodeCtl::Network::HostAddress ConvertHostAddress(const IMA_HOST_ID& host);
};

}  // namespace CoreCtl::Storage

#pragma GCC visibility pop

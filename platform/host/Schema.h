/// What kinds of objects a host is made of, and the words of their keys.
///
/// A new kind of object: a number here, a table of keys, a row in Schema.cpp, and a row among the children of
/// its parent.
#pragma once

#include <string_view>

#include "host/Storage.h"
#include "store/Schema.h"

/// The numbers stand in databases: new ones are added, none ever changes its meaning.
enum class store::Kind : int {
  Host = 1,
  Answer = 2,
  Adapter = 3,
  // LevelSchema.h
  SendTarget = 10,
  StaticTarget = 11,
  // TargetSchema.h
  Target = 20,
  Session = 21,
  Connection = 22,
  Plugin = 23,
  Route = 24,
  // NetworkSchema.h
  Nic = 40,
  NetworkPortal = 41,
  LogicalPortal = 42,
  PhysicalPortal = 43,
  IsnsServer = 44,
  BootTable = 45,
  // RemoteSchema.h
  RemotePortal = 60,
  RemoteTarget = 61,
};

namespace host {

// Words of keys, in the order of the numbers that stand for them elsewhere.
inline constexpr std::string_view kAdapterKinds[] = {"independent", "dependent", "software", "scsi"};
inline constexpr std::string_view kExtendedBools[] = {"false", "true", "unknown"};
inline constexpr std::string_view kThrown[] = {"NodeCtlException", "CoreCtlException", "bad_alloc"};

/// Capabilities by the names under which they are shown, in the order of their record.
inline constexpr std::string_view kCapabilities[] = {
    "ISnS Settable",
    "SLP Settable",
    "Static Discovery Settable",
    "Sendtarget Discovery Settable",
    "Authorization Method Settable",
    "CHAP Authorization Supported",
    "SRP Authorization Supported",
    "KRB5 Authorization Supported",
    "SPKM1 Authorization Supported",
    "SPKM2 Authorization Supported",
    "Mutual Authentication Supported",
    "Target Level Authentication Supported",
    "Target Level Mutual Authentication Supported",
    "Adapter Header Digest Supported",
    "Target Level Header Digest Supported",
    "Adapter Data Digest Supported",
    "Target Level Data Digest Supported",
    "ARP Redirect Settable",
    "MTU Settable",
    "Delayed Ack Settable",
    "IPv6 Supported",
    "DNS Based Address Supported",
    "Inheritance Supported",
    "IPv4 Enable Settable",
    "IP Configuration Method Settable",
    "Subnet Mask Setttable",
    "Default Gateway Settable",
    "IPv6 Enable Settable",
    "IPv6 Prefix Length Settable",
    "IPv6 DHCP Configuration Method Settable",
    "IPv6 Linklocal Auto Configuration Method Settable",
    "IPv6 Router Advertisement Configuration Method Settable",
    "IPv6 Default Gateway Settable",
    "Primary DNS Settable",
    "Secondary DNS Settable",
    "Name And Alias Settable",
};

}  // namespace host

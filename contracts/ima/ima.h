/// The iSCSI Management API: the part of the published interface that this system calls.
///
/// Calls return IMA_STATUS_SUCCESS or an error, and leave their out parameters unchanged with an error.
/// Lists and address keys are allocated by the API, owned by the caller and released with IMA_FreeMemory; all
/// other records are the caller's own memory, filled in. Objects are named by IMA_OID, which stays valid for
/// the run of the process and as long as the object exists; a call on one that is gone returns
/// IMA_ERROR_OBJECT_NOT_FOUND, on one of another type IMA_ERROR_INCORRECT_OBJECT_TYPE. Lists keep the
/// implementation's order, which does not change while the objects do not; one without objects has the count
/// 0 and is handed out and released like others. No call throws, and none takes a null pointer.
///
/// Any status but IMA_STATUS_SUCCESS is a failure to front ends, and none of its numbers is shown. Beside
/// those that a call names, each may return IMA_ERROR_INSUFFICIENT_MEMORY and, when the host fails it,
/// IMA_ERROR_UNEXPECTED_OS_ERROR. Front ends call from one thread.
#pragma once

#include <stdint.h>
#include <time.h>
#include <wchar.h>

#pragma GCC visibility push(default)

#ifdef __cplusplus
extern "C" {
#endif

typedef uint8_t IMA_BYTE;
typedef uint16_t IMA_UINT16;
typedef uint32_t IMA_UINT32;
typedef uint64_t IMA_UINT64;
typedef uint32_t IMA_UINT;
typedef uint32_t IMA_BOOL; /* 0 false, 1 true */
typedef wchar_t IMA_WCHAR; /* UTF-32 */
typedef uint32_t IMA_STATUS;
typedef uint32_t IMA_OBJECT_TYPE;
/* Local time of the host, as localtime_r gives it: tm_year counts from 1900, tm_mon from 0. Only the members
   from tm_sec to tm_year mean something. Shown as it is. */
typedef struct tm IMA_DATETIME;

#define IMA_FALSE 0u
#define IMA_TRUE 1u

/* Other errors may occur; front ends treat all alike. */
#define IMA_STATUS_SUCCESS 0x00000000u
#define IMA_ERROR_NOT_SUPPORTED 0x80000001u
#define IMA_ERROR_INSUFFICIENT_MEMORY 0x80000002u
#define IMA_ERROR_LAST_PRIMARY_DISCOVERY_METHOD 0x80000003u
#define IMA_ERROR_INVALID_PARAMETER 0x80000004u
#define IMA_ERROR_INVALID_OBJECT_TYPE 0x80000005u
#define IMA_ERROR_INCORRECT_OBJECT_TYPE 0x80000006u
#define IMA_ERROR_OBJECT_NOT_FOUND 0x80000007u
#define IMA_ERROR_UNEXPECTED_OS_ERROR 0x80000008u
#define IMA_ERROR_SYNC_TIMEOUT 0x80000009u
#define IMA_ERROR_UNKNOWN_ERROR 0x8fffffffu

#define IMA_OBJECT_TYPE_UNKNOWN 0u
#define IMA_OBJECT_TYPE_PLUGIN 1u
#define IMA_OBJECT_TYPE_NODE 2u
#define IMA_OBJECT_TYPE_LHBA 3u
#define IMA_OBJECT_TYPE_PHBA 4u
#define IMA_OBJECT_TYPE_NETWORK_PORTAL 5u
#define IMA_OBJECT_TYPE_PORTAL_GROUP 6u
#define IMA_OBJECT_TYPE_PNP 7u
#define IMA_OBJECT_TYPE_LNP 8u
#define IMA_OBJECT_TYPE_TARGET 9u
#define IMA_OBJECT_TYPE_LU 10u
#define IMA_OBJECT_TYPE_DISC_ADDR 11u
#define IMA_OBJECT_TYPE_STATIC_DISC_TARGET 12u
#define IMA_OBJECT_TYPE_CONNECTION 13u
#define IMA_OBJECT_TYPE_SESSION 14u

/* An object; 16 bytes, passed by value. All zero stands for no object. */
typedef struct {
  IMA_OBJECT_TYPE objectType;      /* one of IMA_OBJECT_TYPE_..., or of the implementation's own for others */
  IMA_UINT32 ownerId;              /* the implementation's own */
  IMA_UINT64 objectSequenceNumber; /* unique for type and owner */
} IMA_OID;

/* oidCount objects stand from oids[0] on. */
typedef struct {
  IMA_UINT oidCount;
  IMA_OID oids[1];
} IMA_OID_LIST;

/* An IP address in network order; IPv4 uses the first four bytes. */
typedef struct {
  IMA_BOOL ipv4Address;   /* other than 0: IPv4; 0: IPv6 */
  IMA_BYTE ipAddress[16]; /* the bytes behind an IPv4 address are 0 */
} IMA_IP_ADDRESS;

/* A host by name (hostnameInUse set) or by address. */
typedef struct {
  IMA_BOOL hostnameInUse;
  union {
    IMA_WCHAR hostname[256]; /* RFC 1123 section 2.1 */
    IMA_IP_ADDRESS ipAddress;
  } id;
} IMA_HOST_ID;

/* Wide texts in records end in a zero character inside their array; an empty one stands for none. */

/* A library behind this API. Of its texts front ends show characters up to 255 rightly. */
typedef struct {
  IMA_UINT supportedImaVersion; /* the version of this API that it follows, from 1 */
  IMA_WCHAR vendor[256];
  IMA_WCHAR implementationVersion[256];
  IMA_WCHAR fileName[256]; /* what users name it by, compared exactly */
  IMA_DATETIME buildTime;  /* all zero where unknown; not shown */
  IMA_BOOL lhbasCanBeCreatedAndDestroyed;
  IMA_BOOL autoPersistenceSupported; /* what is set is kept without a further call */
} IMA_PLUGIN_PROPERTIES;

typedef struct {
  IMA_WCHAR osDeviceName[256];  /* what users name the adapter by; at most 223 bytes of UTF-8 */
  IMA_BOOL luExposingSupported; /* not read */
} IMA_LHBA_PROPERTIES;

/* Which images a physical adapter takes. Firmware and boot code are downloaded without a look at it. */
typedef struct {
  IMA_BOOL isPhbaDownloadFileSupported; /* IMA_IsPhbaDownloadFile works; not read */
  IMA_BOOL optionRomDownloadSupported;  /* an option ROM is downloaded only where this is 1 */
  IMA_BOOL firmwareDownloadSupported;   /* an image of type all only where this or the one above is 1 */
} IMA_PHBA_DOWNLOAD_PROPERTIES;

/* What an image holds. Other numbers may occur; such an image is shown as unknown and not downloaded. */
typedef int32_t IMA_PHBA_DOWNLOAD_IMAGE_TYPE;
#define IMA_DOWNLOAD_IMAGE_TYPE_FIRMWARE 0
#define IMA_DOWNLOAD_IMAGE_TYPE_OPTION_ROM 1
#define IMA_DOWNLOAD_IMAGE_TYPE_ALL 2
#define IMA_DOWNLOAD_IMAGE_TYPE_BOOTCODE 3

typedef uint32_t IMA_EXTENDED_BOOL; /* 0 false, 1 true, any other unknown */

typedef struct {
  IMA_PHBA_DOWNLOAD_IMAGE_TYPE imageType;
  IMA_WCHAR fileVersion[32];  /* shown as unknown above 127 bytes of UTF-8 */
  IMA_WCHAR description[512]; /* shown as unknown above 2047 bytes of UTF-8 */
  IMA_EXTENDED_BOOL upgrade;  /* the image is newer than what the adapter runs */
} IMA_PHBA_DOWNLOAD_IMAGE_PROPERTIES;

/* Flags: by which ways a target is known. Other bits are not read. */
#define IMA_TARGET_DISCOVERY_METHOD_STATIC 1u
#define IMA_TARGET_DISCOVERY_METHOD_SLP 2u
#define IMA_TARGET_DISCOVERY_METHOD_ISNS 4u
#define IMA_TARGET_DISCOVERY_METHOD_SENDTARGETS 8u

typedef struct {
  IMA_WCHAR name[224];                   /* iSCSI name, at most 223 characters (RFC 7143 section 4.2.7) */
  IMA_WCHAR alias[256];                  /* as the target tells it (RFC 7143 section 13.6); empty for none */
  IMA_UINT32 discoveryMethodFlags;       /* any of IMA_TARGET_DISCOVERY_METHOD_..., added; 0 for none */
  IMA_BOOL sendTargetsDiscoverySettable; /* SendTargets to this target can be switched */
  IMA_BOOL sendTargetsDiscoveryEnabled;  /* SendTargets is sent to this target */
} IMA_TARGET_PROPERTIES;

/* One address of a target. Port and tag mean something only when portAndTagPresent is 1. The tag is that of
   the portal group (RFC 7143 section 13.9). */
typedef struct {
  IMA_IP_ADDRESS address;
  IMA_UINT32 portAndTagPresent;
  IMA_UINT16 portNumber;
  IMA_UINT16 targetPortalGroupTag;
} IMA_ADDRESS_KEY;

/* addressKeyCount addresses stand from addressKeys[0] on. */
typedef struct {
  IMA_UINT addressKeyCount;
  IMA_ADDRESS_KEY addressKeys[1];
} IMA_ADDRESS_KEYS;

typedef struct {
  IMA_WCHAR targetName[224]; /* as name of IMA_TARGET_PROPERTIES */
  IMA_HOST_ID targetAddress;
  IMA_UINT16 port;
  IMA_UINT32 tpgtPresent; /* 1 when the tag is known */
  IMA_UINT32 tpgt;        /* portal group tag in the low 16 bits */
} IMA_STATIC_DISCOVERY_TARGET_PROPERTIES;

/* Other numbers may occur and are shown as unsupported. */
typedef uint32_t IMA_AUTHMETHOD;
#define IMA_AUTHMETHOD_NONE 0u
#define IMA_AUTHMETHOD_CHAP 1u

typedef IMA_BYTE IMA_INITIATOR_SESSION_ID[6];

/* Negotiated values of a session, in the units and ranges of RFC 7143 section 13. Booleans are true when
   other than 0. */
typedef struct {
  IMA_OID associatedTargetOid; /* the target that it is with */
  IMA_OID associatedLnpOid;    /* the logical portal that it goes over; all zero where it is not told */
  IMA_AUTHMETHOD authMethod;
  IMA_BOOL dataPduInOrder;
  IMA_BOOL dataSequenceInOrder;
  IMA_UINT32 defaultTime2Retain; /* seconds */
  IMA_UINT32 defaultTime2Wait;   /* seconds */
  IMA_UINT32 errorRecoveryLevel;
  IMA_UINT32 firstBurstLength; /* bytes */
  IMA_BOOL immediateData;
  IMA_BOOL initialR2T;
  IMA_INITIATOR_SESSION_ID isid; /* RFC 7143 section 11.12.5 */
  IMA_UINT32 maxBurstLength;     /* bytes */
  IMA_UINT32 maxConnections;
  IMA_UINT32 maxOutstandingR2T;
  IMA_UINT16 targetPortalGroupTag;
  IMA_UINT16 tsih; /* RFC 7143 section 11.12.6; not 0 */
} IMA_SESSION_PROPERTIES;

/* A negotiated digest. There is no other number: front ends fail on one. */
typedef uint32_t IMA_DIGEST_TYPE;
#define IMA_DIGEST_NONE 0u
#define IMA_DIGEST_CRC32C 1u

/* Negotiated values of a connection. Markers are those of RFC 3720 appendix A (obsolete, RFC 7143
   section 13.25), their intervals in 4-byte words, 0 without markers. */
typedef struct {
  IMA_OID associatedSessionOid;
  IMA_UINT16 connectionId; /* RFC 7143 section 11.12.7; unique in its session */
  IMA_DIGEST_TYPE dataDigest;
  IMA_DIGEST_TYPE headerDigest;
  IMA_BOOL ifMarker;
  IMA_UINT32 ifMarkerInterval;
  IMA_UINT32 maxRecvDataSegmentLength;     /* what the initiator takes, in bytes */
  IMA_UINT32 maxTransmitDataSegmentLength; /* what the target takes, in bytes */
  IMA_BOOL ofMarker;
  IMA_UINT32 ofMarkerInterval;
} IMA_CONNECTION_PROPERTIES;

typedef struct {
  IMA_IP_ADDRESS ipAddress; /* 0.0.0.0 for none */
  IMA_OID associatedLnp;    /* the logical portal that it stands on */
} IMA_NETWORK_PORTAL_PROPERTIES;

/* Releases what a call of this API handed out. IMA_ERROR_INVALID_PARAMETER for anything else, which is then
   left alone, null included. */
IMA_STATUS IMA_FreeMemory(void* memory);

/* The plug-ins of the host. */
IMA_STATUS IMA_GetPluginOidList(IMA_OID_LIST** list);
IMA_STATUS IMA_GetPluginProperties(IMA_OID pluginOid, IMA_PLUGIN_PROPERTIES* properties);
/* The plug-in that serves the object @p oid, an adapter or what is below one. IMA_ERROR_OBJECT_NOT_FOUND
   where none does. */
IMA_STATUS IMA_GetAssociatedPluginOid(IMA_OID oid, IMA_OID* pluginOid);

/* Logical adapters: the iSCSI adapters that the control library knows, in the same order. */
IMA_STATUS IMA_GetLhbaOidList(IMA_OID_LIST** list);
IMA_STATUS IMA_GetLhbaProperties(IMA_OID lhbaOid, IMA_LHBA_PROPERTIES* properties);

/* Physical adapters, the hardware that one or several logical ones stand on. */
IMA_STATUS IMA_GetPhbaOidList(IMA_OID_LIST** list);
IMA_STATUS IMA_GetPhbaDownloadProperties(IMA_OID phbaOid, IMA_PHBA_DOWNLOAD_PROPERTIES* properties);
/* Succeeds when the file @p path is an image for this adapter, and tells what is in it. The path is UTF-32
   ending in a zero, as the user gave it. IMA_ERROR_INVALID_PARAMETER for a file that cannot be read, is no
   image or is one for another model; IMA_ERROR_NOT_SUPPORTED where the adapter takes no images. */
IMA_STATUS IMA_IsPhbaDownloadFile(IMA_OID phbaOid, const IMA_WCHAR* path,
                                  IMA_PHBA_DOWNLOAD_IMAGE_PROPERTIES* properties);
/* Downloads the image @p path of the type @p imageType; returns when the adapter runs it, without a reset or
   reboot. Errors are those of IMA_IsPhbaDownloadFile, and IMA_ERROR_INVALID_PARAMETER for an image of another
   type; the adapter then runs what it ran before. */
IMA_STATUS IMA_PhbaDownload(IMA_OID phbaOid, IMA_PHBA_DOWNLOAD_IMAGE_TYPE imageType, const IMA_WCHAR* path);

/* Targets of a logical adapter, each once by its name, with sessions or without. */
IMA_STATUS IMA_GetTargetOidList(IMA_OID lhbaOid, IMA_OID_LIST** list);
IMA_STATUS IMA_GetTargetProperties(IMA_OID targetOid, IMA_TARGET_PROPERTIES* properties);
/* The addresses of a target; a portal that is known by a host name has none. None is no error. */
IMA_STATUS IMA_GetAddressKeys(IMA_OID targetOid, IMA_ADDRESS_KEYS** keys);
/* Static targets, one for each address; those found by discovery are not among them. */
IMA_STATUS IMA_GetStaticDiscoveryTargetOidList(IMA_OID lhbaOid, IMA_OID_LIST** list);
IMA_STATUS IMA_GetStaticDiscoveryTargetProperties(IMA_OID staticTargetOid,
                                                  IMA_STATIC_DISCOVERY_TARGET_PROPERTIES* properties);

/* Sessions of a target and their connections. */
IMA_STATUS IMA_GetSessionOidList(IMA_OID targetOid, IMA_OID_LIST** list);
IMA_STATUS IMA_GetSessionProperties(IMA_OID sessionOid, IMA_SESSION_PROPERTIES* properties);
IMA_STATUS IMA_GetConnectionOidList(IMA_OID sessionOid, IMA_OID_LIST** list);
IMA_STATUS IMA_GetConnectionProperties(IMA_OID connectionOid, IMA_CONNECTION_PROPERTIES* properties);

/* Network portals: IMA_TSR_GetNetworkPortalOidList lists them. */
IMA_STATUS IMA_GetNetworkPortalProperties(IMA_OID portalOid, IMA_NETWORK_PORTAL_PROPERTIES* properties);

#ifdef __cplusplus
}
#endif

#pragma GCC visibility pop

/// Vendor extensions of the iSCSI Management API. The rules of the published calls hold here too.
#pragma once

#include <ima/ima.h>

#pragma GCC visibility push(default)

#ifdef __cplusplus
extern "C" {
#endif

/* Internal configuration items, each a 32-bit value. */
#define IMA_TSR_CONFIG_BOOT_TARGET 4u  /* of a static target: 1 for a boot target */
#define IMA_TSR_CONFIG_LOGIN_STATUS 5u /* of a target: its last login status word */

/* Login status word: bits 31 to 16 tell where the status comes from. With the source NONE the last login
   worked or there was none; with RESPONSE, bits 15 to 8 and 7 to 0 are the Status-Class and Status-Detail of
   the login response (RFC 7143 section 11.13.5). Any other source, and its lower bits, are the
   implementation's own, for a login that failed without a response; the word is then shown as a number. */
#define IMA_TSR_LOGIN_SOURCE_NONE 0u
#define IMA_TSR_LOGIN_SOURCE_RESPONSE 5u

/* The state of a connection, and what is known of its addresses and times. A member with one called Present
   in front of it means something only when that is exactly 1. */
typedef struct {
  IMA_UINT32 connectionAddressPresent;
  IMA_IP_ADDRESS connectionAddress; /* the portal that the connection was made to */
  IMA_UINT32 remoteAddressPresent;
  IMA_IP_ADDRESS remoteAddress; /* the portal that it talks to now */
  IMA_UINT32 localAddressPresent;
  IMA_IP_ADDRESS localAddress; /* the host's own address on it */
  /* 0 free, 1 xpt_wait, 2 xpt_up, 3 in_login, 4 logged_in, 5 in_logout, 6 logout_requested, 7 cleanup_wait:
     the states S1 to S8 of RFC 7143 section 8.1. There is no other number: front ends index with it. */
  IMA_UINT32 state;
  IMA_UINT32 connectionCreateTimePresent;
  IMA_DATETIME connectionCreateTime; /* when the connection was made */
  IMA_UINT32 connectionStartTimePresent;
  IMA_DATETIME connectionStartTime; /* when it began to carry commands */
  IMA_UINT32 sessionCreateTimePresent;
  IMA_DATETIME sessionCreateTime; /* when its session was made */
} IMA_TSR_CONNECTION_STATUS;

/* Bytes of a portal's name, UTF-8; a longer one is cut. */
#define IMA_TSR_INTERFACE_NAME_SIZE 32

/* A route entry of an adapter. The three addresses are of one family. The name of the portal that it belongs
   to fills its array without a zero when it is 32 bytes long. */
typedef struct {
  IMA_IP_ADDRESS destination; /* the network: zero bits where the mask has them */
  IMA_IP_ADDRESS netmask;     /* ones, then zeros; all zeros for the default route */
  IMA_IP_ADDRESS gateway;
  IMA_UINT32 metric;     /* 0 to 4294967295; of two routes to a host the lesser wins */
  IMA_UINT32 associated; /* non-zero when tied to a portal */
  char interfaceName[IMA_TSR_INTERFACE_NAME_SIZE];
  IMA_BYTE reserved[64]; /* the implementation's own; zero in a record of the caller's */
} IMA_TSR_ROUTE_PROPERTIES;

/* A logical network portal. The name fills its array without a zero when it is 32 bytes long. */
typedef struct {
  char name[IMA_TSR_INTERFACE_NAME_SIZE]; /* unique on the adapter; that of the host NIC where one is bound */
  IMA_BYTE macAddress[6];                 /* in the order of transmission; all zero where unknown */
} IMA_TSR_LNP_PROPERTIES;

/* The logical adapters of one physical adapter. None is no error. */
IMA_STATUS IMA_TSR_GetLhbaOidList(IMA_OID phbaOid, IMA_OID_LIST** list);

/* Reads item @p key of the object into @p buffer of @p size bytes; the size must be that of the item, 4.
   IMA_ERROR_INVALID_PARAMETER for another, IMA_ERROR_NOT_SUPPORTED for a key that there is not; front ends
   show "na" for an item that fails. */
IMA_STATUS IMA_TSR_GetInternalConfigData(IMA_OID oid, IMA_UINT key, void* buffer, IMA_UINT size);

/* Logs in sessions for an adapter, a target, or a session that is to be duplicated. For an adapter: with each
   of its targets, over each way out by which there is none; that there is nothing to do is success. For a
   target: the same, and where there is one by each way, one more. For a session: one more beside it, by its
   way out. Returns when the logins have ended. When any of them fails, refused or unanswered, the status is
   IMA_ERROR_UNKNOWN_ERROR: the login status word of its target tells why, and the sessions that were made
   stay. An adapter that is not online is IMA_ERROR_INVALID_PARAMETER. The three further arguments are
   reserved and zero. */
IMA_STATUS IMA_TSR_AddSession(IMA_OID oid, IMA_UINT reserved1, IMA_UINT reserved2, IMA_UINT reserved3);
/* Logs out the sessions of an adapter or a target, or one session. That there is none to log out is success.
   The target stays, and its login status word; a later discovery or login makes sessions again. */
IMA_STATUS IMA_TSR_RemoveSession(IMA_OID oid);
IMA_STATUS IMA_TSR_GetConnectionStatus(IMA_OID connectionOid, IMA_TSR_CONNECTION_STATUS* status);

/* Routes of an adapter. A new route belongs to no portal until it is associated with one. All changes take
   effect at once. */
IMA_STATUS IMA_TSR_GetRouteOidList(IMA_OID lhbaOid, IMA_OID_LIST** list);
IMA_STATUS IMA_TSR_GetRouteProperties(IMA_OID routeOid, IMA_TSR_ROUTE_PROPERTIES* properties);
/* Adds a route; the member associated is not read. IMA_ERROR_INVALID_PARAMETER for a duplicate, which is one
   with the same addresses, metric and name of the portal, for addresses of different families, a mask with
   gaps, and a destination with bits beyond the mask. */
IMA_STATUS IMA_TSR_AddRoute(IMA_OID lhbaOid, IMA_TSR_ROUTE_PROPERTIES properties, IMA_OID* routeOid);
/* Removes a route, its association with it; it need not be disassociated first. */
IMA_STATUS IMA_TSR_RemoveRoute(IMA_OID routeOid);
/* Ties a route to a portal, whose name it takes. IMA_ERROR_INVALID_PARAMETER for one that is tied already, to
   this portal or another; IMA_ERROR_OBJECT_NOT_FOUND for a route or portal of another adapter. */
IMA_STATUS IMA_TSR_AssociateRoute(IMA_OID lhbaOid, IMA_OID routeOid, IMA_OID portalOid);
/* Unties a route, which keeps the name of the portal. IMA_ERROR_OBJECT_NOT_FOUND for one that is not tied to
   this portal, and for a route or portal of another adapter. */
IMA_STATUS IMA_TSR_DisassociateRoute(IMA_OID lhbaOid, IMA_OID routeOid, IMA_OID portalOid);

/* Network portals of an adapter, and the logical portals that they stand on. IMA_ERROR_NOT_SUPPORTED from the
   latter for an adapter that cannot tell its logical portals. */
IMA_STATUS IMA_TSR_GetNetworkPortalOidList(IMA_OID lhbaOid, IMA_OID_LIST** list);
IMA_STATUS IMA_TSR_GetLnpProperties(IMA_OID lnpOid, IMA_TSR_LNP_PROPERTIES* properties);

#ifdef __cplusplus
}
#endif

#pragma GCC visibility pop

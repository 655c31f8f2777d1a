/// Texts that several commands show, and two texts of the library that some commands know.
#pragma once

namespace TessaroCli {

inline constexpr char InvalidAdapterMessage[] = "Invalid adapter specified or unable to get adapter.";
inline constexpr char OperationNotSupportedMessage[] = "Operation not supported for this adapter.";
inline constexpr char InvalidChapInputMessage[] =
    "Invalid CHAP authentication input. Make sure [--default] or [--authname --secret --level] is given.";
inline constexpr char InvalidAuthDirectionMessage[] = "Invalid authentication direction.";
inline constexpr char InvalidAuthMethodMessage[] = "Invalid authentication method.";
inline constexpr char InvalidAuthLevelMessage[] =
    "Invalid authentication level. Mutual CHAP can only be [prohibited] or [required].";
inline constexpr char RebootRequiredMessage[] = "Reboot required to complete operation.";
inline constexpr char InvalidAddressMessage[] = "Invalid address input.";
inline constexpr char InvalidNetworkPortalInputMessage[] = "Invalid networkportal input.";
inline constexpr char InvalidNameOrAliasMessage[] =
    "Invalid iscsi name or alias input. Make sure at least one of [--name] and [--alias] is given.";
inline constexpr char InvalidNameMessage[] = "Invalid iscsi name input.";
inline constexpr char InvalidKeyMessage[] = "Invalid iscsi key input.";
inline constexpr char InvalidValueMessage[] = "Invalid iscsi value input.";
inline constexpr char InvalidDefaultUseMessage[] =
    "Invalid default option use, it does not take false/no/n/0 value.";
inline constexpr char InvalidChapCombinationMessage[] =
    "Invalid CHAP and Mutual CHAP combination. If setting mutual CHAP, make sure CHAP is on [required] "
    "level.";
inline constexpr char InvalidIsnsMethodMessage[] = "Invalid iSNS discovery method.";

// Not shown: an adapter with a network stack of its own fails with one of these, whole, where it lacks the
// call.
inline constexpr char LnpListNotSupportedMessage[] =
    "iScsiLibException: status(80000001): Not supported; Message= IMA_TSR_GetLnpOidList";
inline constexpr char NicPropertiesNotSupportedMessage[] =
    "iScsiLibException: status(80000001): Not supported; Message= IMA_TSR_GetNicProperties";

}  // namespace TessaroCli

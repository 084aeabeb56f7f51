#pragma once

// The Native Wifi interface: the SDK's own header on Windows, elsewhere the same declarations, as far as the
// system uses them, with the same names and the layout of 64-bit Windows.

#if defined(_WIN32)

#include <windows.h>
// After <windows.h>.
#include <wlanapi.h>

// What WLAN_NOTIFICATION_SOURCE_ALL stands for; not every edition of <l2cmn.h> has it.
#if !defined(L2_NOTIFICATION_SOURCE_ALL)
#define L2_NOTIFICATION_SOURCE_ALL 0x0000FFFF
#endif

#else

#include <cstdint>

using BOOL = int;
using BYTE = unsigned char;
using UCHAR = unsigned char;
using USHORT = std::uint16_t;
using ULONG = std::uint32_t;
using DWORD = std::uint32_t;
using WCHAR = char16_t;
using LPWSTR = WCHAR*;
using LPCWSTR = const WCHAR*;
using PVOID = void*;
using HANDLE = void*;
using PDWORD = DWORD*;
using PHANDLE = HANDLE*;

struct GUID {
    std::uint32_t Data1;
    std::uint16_t Data2;
    std::uint16_t Data3;
    std::uint8_t Data4[8];
};

#define WINAPI

inline const HANDLE INVALID_HANDLE_VALUE =
    reinterpret_cast<HANDLE>(~std::uintptr_t{0});  // NOLINT(performance-no-int-to-ptr)

inline constexpr BOOL FALSE = 0;
inline constexpr BOOL TRUE = 1;

inline constexpr DWORD ERROR_SUCCESS = 0;
inline constexpr DWORD ERROR_INVALID_HANDLE = 6;
inline constexpr DWORD ERROR_NOT_SUPPORTED = 50;
inline constexpr DWORD ERROR_INVALID_PARAMETER = 87;
inline constexpr DWORD ERROR_INSUFFICIENT_BUFFER = 122;
inline constexpr DWORD ERROR_NOT_FOUND = 1168;
inline constexpr DWORD ERROR_BAD_PROFILE = 1206;
inline constexpr DWORD ERROR_INVALID_STATE = 5023;

inline constexpr DWORD WLAN_NOTIFICATION_SOURCE_NONE = 0;
inline constexpr DWORD WLAN_NOTIFICATION_SOURCE_ALL = 0xFFFF;
inline constexpr DWORD WLAN_NOTIFICATION_SOURCE_ACM = 0x08;
inline constexpr DWORD WLAN_NOTIFICATION_SOURCE_MSM = 0x10;
inline constexpr DWORD WLAN_NOTIFICATION_SOURCE_IHV = 0x40;

inline constexpr DWORD WLAN_CONNECTION_HIDDEN_NETWORK = 1;

inline constexpr DWORD WLAN_MAX_NAME_LENGTH = 256;
inline constexpr DWORD WLAN_MAX_PHY_INDEX = 64;
inline constexpr DWORD DOT11_SSID_MAX_LENGTH = 32;

struct DOT11_SSID {
    ULONG uSSIDLength;
    UCHAR ucSSID[DOT11_SSID_MAX_LENGTH];
};

// Of a fixed type, since what comes in a notification may hold any number.

enum DOT11_RADIO_STATE : int {
    dot11_radio_state_unknown,
    dot11_radio_state_on,
    dot11_radio_state_off,
};

enum DOT11_BSS_TYPE : int {
    dot11_BSS_type_infrastructure = 1,
    dot11_BSS_type_independent = 2,
    dot11_BSS_type_any = 3,
};

enum WLAN_INTERFACE_STATE : int {
    wlan_interface_state_not_ready,
    wlan_interface_state_connected,
    wlan_interface_state_ad_hoc_network_formed,
    wlan_interface_state_disconnecting,
    wlan_interface_state_disconnected,
    wlan_interface_state_associating,
    wlan_interface_state_discovering,
    wlan_interface_state_authenticating,
};

enum WLAN_CONNECTION_MODE : int {
    wlan_connection_mode_profile,
    wlan_connection_mode_temporary_profile,
    wlan_connection_mode_discovery_secure,
    wlan_connection_mode_discovery_unsecure,
    wlan_connection_mode_auto,
    wlan_connection_mode_invalid,
};

enum WLAN_INTF_OPCODE : int {
    wlan_intf_opcode_radio_state = 4,
    wlan_intf_opcode_interface_state = 6,
    wlan_intf_opcode_current_connection = 7,
    wlan_intf_opcode_channel_number = 8,
};

enum WLAN_OPCODE_VALUE_TYPE : int { wlan_opcode_value_type_query_only };

enum WLAN_IHV_CONTROL_TYPE : int {
    wlan_ihv_control_type_service,
    wlan_ihv_control_type_driver,
};

struct WLAN_INTERFACE_INFO {
    GUID InterfaceGuid;
    WCHAR strInterfaceDescription[WLAN_MAX_NAME_LENGTH];
    WLAN_INTERFACE_STATE isState;
};

struct WLAN_INTERFACE_INFO_LIST {
    DWORD dwNumberOfItems;
    DWORD dwIndex;
    WLAN_INTERFACE_INFO InterfaceInfo[1];
};
using PWLAN_INTERFACE_INFO_LIST = WLAN_INTERFACE_INFO_LIST*;

struct WLAN_PHY_RADIO_STATE {
    DWORD dwPhyIndex;
    DOT11_RADIO_STATE dot11SoftwareRadioState;
    DOT11_RADIO_STATE dot11HardwareRadioState;
};

struct WLAN_RADIO_STATE {
    DWORD dwNumberOfPhys;
    WLAN_PHY_RADIO_STATE PhyRadioState[WLAN_MAX_PHY_INDEX];
};

struct WLAN_NOTIFICATION_DATA {
    DWORD NotificationSource;
    DWORD NotificationCode;
    GUID InterfaceGuid;
    DWORD dwDataSize;
    PVOID pData;
};
using PWLAN_NOTIFICATION_DATA = WLAN_NOTIFICATION_DATA*;

struct WLAN_CONNECTION_NOTIFICATION_DATA {
    WLAN_CONNECTION_MODE wlanConnectionMode;
    WCHAR strProfileName[WLAN_MAX_NAME_LENGTH];
    DOT11_SSID dot11Ssid;
    DOT11_BSS_TYPE dot11BssType;
    BOOL bSecurityEnabled;
    DWORD wlanReasonCode;
    DWORD dwFlags;
    WCHAR strProfileXml[1];
};

using DOT11_MAC_ADDRESS = UCHAR[6];

struct WLAN_ASSOCIATION_ATTRIBUTES {
    DOT11_SSID dot11Ssid;
    DOT11_BSS_TYPE dot11BssType;
    DOT11_MAC_ADDRESS dot11Bssid;
    DWORD dot11PhyType;
    ULONG uDot11PhyIndex;
    ULONG wlanSignalQuality;
    ULONG ulRxRate;
    ULONG ulTxRate;
};

struct WLAN_SECURITY_ATTRIBUTES {
    BOOL bSecurityEnabled;
    BOOL bOneXEnabled;
    DWORD dot11AuthAlgorithm;
    DWORD dot11CipherAlgorithm;
};

struct WLAN_CONNECTION_ATTRIBUTES {
    WLAN_INTERFACE_STATE isState;
    WLAN_CONNECTION_MODE wlanConnectionMode;
    WCHAR strProfileName[WLAN_MAX_NAME_LENGTH];
    WLAN_ASSOCIATION_ATTRIBUTES wlanAssociationAttributes;
    WLAN_SECURITY_ATTRIBUTES wlanSecurityAttributes;
};

struct NDIS_OBJECT_HEADER {
    UCHAR Type;
    UCHAR Revision;
    USHORT Size;
};

struct DOT11_BSSID_LIST {
    NDIS_OBJECT_HEADER Header;
    ULONG uNumOfEntries;
    ULONG uTotalNumOfEntries;
    DOT11_MAC_ADDRESS BSSIDs[1];
};

struct WLAN_CONNECTION_PARAMETERS {
    WLAN_CONNECTION_MODE wlanConnectionMode;
    LPCWSTR strProfile;
    DOT11_SSID* pDot11Ssid;
    DOT11_BSSID_LIST* pDesiredBssidList;
    DOT11_BSS_TYPE dot11BssType;
    DWORD dwFlags;
};
using PWLAN_CONNECTION_PARAMETERS = WLAN_CONNECTION_PARAMETERS*;

using WLAN_NOTIFICATION_CALLBACK = void (*)(PWLAN_NOTIFICATION_DATA, PVOID);

DWORD WlanOpenHandle(DWORD dwClientVersion, PVOID pReserved, PDWORD pdwNegotiatedVersion,
                     PHANDLE phClientHandle);
DWORD WlanCloseHandle(HANDLE hClientHandle, PVOID pReserved);
DWORD WlanEnumInterfaces(HANDLE hClientHandle, PVOID pReserved, PWLAN_INTERFACE_INFO_LIST* ppInterfaceList);
void WlanFreeMemory(PVOID pMemory);
DWORD WlanQueryInterface(HANDLE hClientHandle, const GUID* pInterfaceGuid, WLAN_INTF_OPCODE OpCode,
                         PVOID pReserved, PDWORD pdwDataSize, PVOID* ppData,
                         WLAN_OPCODE_VALUE_TYPE* pWlanOpcodeValueType);
DWORD WlanConnect(HANDLE hClientHandle, const GUID* pInterfaceGuid,
                  const PWLAN_CONNECTION_PARAMETERS pConnectionParameters, PVOID pReserved);
DWORD WlanDisconnect(HANDLE hClientHandle, const GUID* pInterfaceGuid, PVOID pReserved);
DWORD WlanReasonCodeToString(DWORD dwReasonCode, DWORD dwBufferSize, LPWSTR pStringBuffer, PVOID pReserved);
DWORD WlanRegisterNotification(HANDLE hClientHandle, DWORD dwNotifSource, BOOL bIgnoreDuplicate,
                               WLAN_NOTIFICATION_CALLBACK funcCallback, PVOID pCallbackContext,
                               PVOID pReserved, PDWORD pdwPrevNotifSource);
DWORD WlanIhvControl(HANDLE hClientHandle, const GUID* pInterfaceGuid, WLAN_IHV_CONTROL_TYPE Type,
                     DWORD dwInBufferSize, PVOID pInBuffer, DWORD dwOutBufferSize, PVOID pOutBuffer,
                     PDWORD pdwBytesReturned);

#endif

#pragma once

namespace vexa::contract {

// The names of commands and events on the two ports. An event that answers a command bears the command's
// name.

// The hotspot port.

inline constexpr const char* kGetAllNetworkList = "GET_ALL_NETWORK_LIST";
inline constexpr const char* kGetAllCredentialList = "GET_ALL_CREDENTIAL_LIST";
inline constexpr const char* kGetIsInternetAccess = "GET_IS_INTERNET_ACCESS";
inline constexpr const char* kGetIsCardIn = "GET_IS_CARD_IN";
inline constexpr const char* kGetRadio = "GET_RADIO";
inline constexpr const char* kSetHotspotAutoConnect = "SET_HOTSPOT_AUTO_CONNECT";
inline constexpr const char* kUpdateNetworkRealm = "UPDATE_NETWORK_REALM";
inline constexpr const char* kReadCredentialFromFile = "READ_CREDENTIAL_FROM_FILE";
inline constexpr const char* kAddCredential = "ADD_CREDENTIAL";
inline constexpr const char* kDeleteCredential = "DELETE_CREDENTIAL";
inline constexpr const char* kEditCredential = "EDIT_CREDENTIAL";
inline constexpr const char* kSetPositionCredential = "SET_POSITION_CREDENTIAL";
inline constexpr const char* kConnectNetwork = "CONNECT_NETWORK";
inline constexpr const char* kDisconnectNetwork = "DISCONNECT_NETWORK";

// Events of the hotspot port, and of both.

inline constexpr const char* kCardPlugIn = "CARD_PLUG_IN";
inline constexpr const char* kCardPlugOut = "CARD_PLUG_OUT";
inline constexpr const char* kRadioOn = "RADIO_ON";
inline constexpr const char* kRadioOff = "RADIO_OFF";
inline constexpr const char* kConnectDisconnect = "CONNECT_DISCONNECT";
inline constexpr const char* kDetectedHotspot = "DETECTED_HOTSPOT";
inline constexpr const char* kSupplicantStateChange = "SUPPLICANT_STATE_CHANGE";

// The spectral port.

inline constexpr const char* kFullScan = "FULL_SCAN";
inline constexpr const char* kStopScan = "STOP_SCAN";
inline constexpr const char* kGetCurrentChannel = "GET_CURRENT_CHANNEL";
inline constexpr const char* kGetChannelList = "GET_CHANNEL_LIST";

inline constexpr const char* kChannelListData = "SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G";
inline constexpr const char* kCurrentChannelData = "SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA";
inline constexpr const char* kSampleDataCongestion = "SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION";
inline constexpr const char* kSampleDataInterference = "SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE";

// Where an event comes from.

inline constexpr const char* kHotspotSource = "HotSpot20";
inline constexpr const char* kSpectralSource = "SpectralAnalyser";

}  // namespace vexa::contract

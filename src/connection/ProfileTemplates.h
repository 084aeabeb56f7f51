#pragma once

#include <string>
#include <vector>

namespace vexa {

/// A text is cut behind this many UTF-16 units.
inline constexpr std::size_t kMaxProfileText = 5119;

// The texts of a WLAN profile. Values go in as they stand, with nothing escaped.

/// `values`: name, SSID in hex, name again, authMode, the EAP text.
std::wstring profileText(const std::vector<std::wstring>& values);

/// `values`: SimpleCertSelection, DisableUserPromptForServerValidation, ServerNames, TrustedRootCA,
/// DifferentUsername, PerformServerValidation, AcceptServerName.
std::wstring eapTlsText(const std::vector<std::wstring>& values);

/// `values`: user name, password, domain, identity.
std::wstring eapTtlsText(const std::vector<std::wstring>& values);

/// Each character as two hex digits, lower case, up to the first NUL.
std::wstring ssidToHexString(const std::wstring& ssid);

}  // namespace vexa

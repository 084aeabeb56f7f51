#include "connection/ProfileTemplates.h"

#include <cassert>
#include <string_view>

#include "text/TextConversion.h"

// The namespaces that the platform publishes for the schemas.
#define NAMESPACE(path) L"http://www.microsoft.com" path
#define EAP_HOST_CONFIG NAMESPACE(L"/provisioning/EapHostConfig")
#define EAP_COMMON NAMESPACE(L"/provisioning/EapCommon")
#define EAP_TLS_V2 NAMESPACE(L"/provisioning/EapTlsConnectionPropertiesV2")

namespace vexa {

namespace {

constexpr std::wstring_view kProfileTemplate =
    L"<?xml version=\"1.0\"?><WLANProfile xmlns=\"" NAMESPACE(L"/networking/WLAN/profile/v1")
    L"\"> \t<name>%s</name>\t<SSIDConfig>\t\t<SSID>\t\t\t<hex>%s</hex>\t\t\t<name>%s</name>\t\t</SSID>"
    L"\t\t<nonBroadcast>false</nonBroadcast>\t</SSIDConfig>\t<connectionType>ESS</connectionType>"
    L"\t<connectionMode>auto</connectionMode>\t<autoSwitch>false</autoSwitch>\t<MSM>\t\t<security> "
    L"\t\t\t<authEncryption> \t\t\t\t<authentication>WPA2</authentication> "
    L"\t\t\t\t<encryption>AES</encryption> \t\t\t\t<useOneX>true</useOneX> \t\t\t</authEncryption> "
    L"\t\t\t<OneX xmlns=\"" NAMESPACE(L"/networking/OneX/v1")
    L"\"> \t\t\t\t<cacheUserData>false</cacheUserData>\t\t\t\t<authMode>%s</authMode>"
    L"\t\t\t\t<EAPConfig>%s</EAPConfig> \t\t\t</OneX> \t\t</security> \t</MSM> </WLANProfile>";
static_assert(kProfileTemplate.size() == 700);

constexpr std::wstring_view kEapTlsTemplate =
    L"<EapHostConfig xmlns=\"" EAP_HOST_CONFIG
    L"\">\t<EapMethod>\t\t<Type xmlns=\"" EAP_COMMON
    L"\">13</Type>\t\t<VendorId xmlns=\"" EAP_COMMON
    L"\">0</VendorId>\t\t<VendorType xmlns=\"" EAP_COMMON
    L"\">0</VendorType>\t\t<AuthorId xmlns=\"" EAP_COMMON
    L"\">0</AuthorId>\t</EapMethod>\t<Config xmlns=\"" EAP_HOST_CONFIG
    L"\">\t\t<Eap xmlns=\"" NAMESPACE(L"/provisioning/BaseEapConnectionPropertiesV1")
    L"\">\t\t\t<Type>13</Type>\t\t\t<EapType xmlns=\"" NAMESPACE(L"/provisioning/EapTlsConnectionPropertiesV1")
    L"\">\t\t\t\t<CredentialsSource>\t\t\t\t\t<CertificateStore>"
    L"\t\t\t\t\t\t<SimpleCertSelection>%s</SimpleCertSelection>\t\t\t\t\t</CertificateStore>"
    L"\t\t\t\t</CredentialsSource>\t\t\t\t<ServerValidation>"
    L"\t\t\t\t\t<DisableUserPromptForServerValidation>%s</DisableUserPromptForServerValidation>"
    L"\t\t\t\t\t<ServerNames>%s</ServerNames>\t\t\t\t\t<TrustedRootCA>%s</TrustedRootCA>"
    L"\t\t\t\t</ServerValidation>\t\t\t\t<DifferentUsername>%s</DifferentUsername>"
    L"\t\t\t\t<PerformServerValidation xmlns=\"" EAP_TLS_V2
    L"\">%s</PerformServerValidation>\t\t\t\t<AcceptServerName xmlns=\"" EAP_TLS_V2
    L"\">%s</AcceptServerName>\t\t\t</EapType>\t\t</Eap>\t</Config></EapHostConfig>";
static_assert(kEapTlsTemplate.size() == 1362);

constexpr std::wstring_view kEapTtlsTemplate =
    L"<EapHostConfig xmlns=\"" EAP_HOST_CONFIG
    L"\">\t<EapMethod>\t\t<Type xmlns=\"" EAP_COMMON
    L"\">21</Type>\t\t<VendorId xmlns=\"" EAP_COMMON
    L"\">0</VendorId>\t\t<VendorType xmlns=\"" EAP_COMMON
    L"\">0</VendorType>\t\t<AuthorId xmlns=\"" EAP_COMMON
    L"\">9442</AuthorId>\t</EapMethod>\t<Config xmlns=\"" EAP_HOST_CONFIG
    L"\">\t\t<ConnData>\t\t\t<username>%s</username>\t\t\t<password>%s</password>\t\t\t<domain>%s</domain>"
    L"\t\t\t<identity>%s</identity>\t\t</ConnData>\t</Config></EapHostConfig>";
static_assert(kEapTtlsTemplate.size() == 640);

// Not printf: a value may hold anything, and `%s` means another thing on each platform.
std::wstring fill(std::wstring_view text, const std::vector<std::wstring>& values) {
    std::wstring filled;
    for (const std::wstring& value : values) {
        const std::size_t place = text.find(L"%s");
        assert(place != std::wstring_view::npos);
        filled.append(text.substr(0, place)).append(value);
        text.remove_prefix(place + 2);
    }
    return cutToUtf16Units(filled.append(text), kMaxProfileText);
}

}  // namespace

std::wstring profileText(const std::vector<std::wstring>& values) {
    return fill(kProfileTemplate, values);
}

std::wstring eapTlsText(const std::vector<std::wstring>& values) {
    return fill(kEapTlsTemplate, values);
}

std::wstring eapTtlsText(const std::vector<std::wstring>& values) {
    return fill(kEapTtlsTemplate, values);
}

std::wstring ssidToHexString(const std::wstring& ssid) {
    static constexpr std::wstring_view kDigits = L"0123456789abcdef";
    std::wstring hex;
    for (const wchar_t c : ssid.substr(0, ssid.find(L'\0'))) {
        const auto byte = static_cast<std::size_t>(c) & 0xFF;
        hex += kDigits[byte >> 4];
        hex += kDigits[byte & 0x0F];
    }
    return hex;
}

}  // namespace vexa

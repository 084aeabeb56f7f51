#include "connection/NetworkProfileMgr.h"

#include <gtest/gtest.h>

#include "config/ResultCodes.h"
#include "unit/hotspot/LogCapture.h"

namespace vexa::test {
namespace {

// The profile of kTtls for the network "cafe", and the inner part of that of kTls, as the platform gets
// them.
const std::wstring kTtlsProfile =
    L"<?xml version=\"1.0\"?><WLANProfile xmlns=\"http://www.microsoft.com/networking/WLAN/profile/v1\"> "
    L"\t<name>cafe</name>\t<SSIDConfig>\t\t<SSID>\t\t\t<hex>63616665</hex>\t\t\t<name>cafe</name>\t\t</SSID>"
    L"\t\t<nonBroadcast>false</nonBroadcast>\t</SSIDConfig>\t<connectionType>ESS</connectionType>"
    L"\t<connectionMode>auto</connectionMode>\t<autoSwitch>false</autoSwitch>\t<MSM>\t\t<security> "
    L"\t\t\t<authEncryption> \t\t\t\t<authentication>WPA2</authentication> "
    L"\t\t\t\t<encryption>AES</encryption> "
    L"\t\t\t\t<useOneX>true</useOneX> \t\t\t</authEncryption> "
    L"\t\t\t<OneX xmlns=\"http://www.microsoft.com/networking/OneX/v1\"> "
    L"\t\t\t\t<cacheUserData>false</cacheUserData>\t\t\t\t<authMode>machineOrUser</"
    L"authMode>\t\t\t\t<EAPConfig>"
    L"<EapHostConfig xmlns=\"http://www.microsoft.com/provisioning/EapHostConfig\">\t<EapMethod>"
    L"\t\t<Type xmlns=\"http://www.microsoft.com/provisioning/EapCommon\">21</Type>"
    L"\t\t<VendorId xmlns=\"http://www.microsoft.com/provisioning/EapCommon\">0</VendorId>"
    L"\t\t<VendorType xmlns=\"http://www.microsoft.com/provisioning/EapCommon\">0</VendorType>"
    L"\t\t<AuthorId xmlns=\"http://www.microsoft.com/provisioning/EapCommon\">9442</AuthorId>"
    L"\t</EapMethod>\t<Config xmlns=\"http://www.microsoft.com/provisioning/EapHostConfig\">\t\t<ConnData>"
    L"\t\t\t<username>someone</username>\t\t\t<password>secret</password>\t\t\t<domain></domain>"
    L"\t\t\t<identity>anonymous</identity>\t\t</ConnData>\t</Config></EapHostConfig>"
    L"</EAPConfig> \t\t\t</OneX> \t\t</security> \t</MSM> </WLANProfile>";
const std::wstring kTlsPart =
    L"\t\t<Eap xmlns=\"http://www.microsoft.com/provisioning/BaseEapConnectionPropertiesV1\">"
    L"\t\t\t<Type>13</Type>"
    L"\t\t\t<EapType xmlns=\"http://www.microsoft.com/provisioning/EapTlsConnectionPropertiesV1\">"
    L"\t\t\t\t<CredentialsSource>\t\t\t\t\t<CertificateStore>"
    L"\t\t\t\t\t\t<SimpleCertSelection>true</SimpleCertSelection>\t\t\t\t\t</CertificateStore>"
    L"\t\t\t\t</CredentialsSource>\t\t\t\t<ServerValidation>"
    L"\t\t\t\t\t<DisableUserPromptForServerValidation>true</DisableUserPromptForServerValidation>"
    L"\t\t\t\t\t<ServerNames></ServerNames>\t\t\t\t\t<TrustedRootCA>0a1b2c</TrustedRootCA>"
    L"\t\t\t\t</ServerValidation>\t\t\t\t<DifferentUsername>false</DifferentUsername>\t\t\t\t"
    L"<PerformServerValidation xmlns=\"http://www.microsoft.com/provisioning/EapTlsConnectionPropertiesV2\">"
    L"true</PerformServerValidation>\t\t\t\t"
    L"<AcceptServerName xmlns=\"http://www.microsoft.com/provisioning/EapTlsConnectionPropertiesV2\">"
    L"false</AcceptServerName>\t\t\t</EapType>\t\t</Eap>";

using Replacements = std::vector<std::pair<std::wstring, std::wstring>>;

std::wstring with(const Replacements& replacements, std::wstring text = kTtlsProfile) {
    for (const auto& [from, to] : replacements)
        for (std::size_t at = text.find(from); at != text.npos; at = text.find(from, at + to.size()))
            text.replace(at, from.size(), to);
    return text;
}

std::wstring tlsProfile() {
    const std::size_t from = kTtlsProfile.find(L"\t\t<ConnData>");
    const std::wstring inner = kTtlsProfile.substr(from, kTtlsProfile.find(L"\t</Config>") - from);
    return with({{inner, kTlsPart}, {L">21<", L">13<"}, {L">9442<", L">0<"}});
}

Credential credential(std::int32_t method, std::int32_t id = 1) {
    Credential result(id, L"PC\\user", CRED_TYPE_EAP_TTLS, CRED_ACCESS_ALL_USER);
    result.m_eapMethod = method;
    result.m_username = L"someone";
    result.m_password = L"secret";
    result.m_caCert = L"0a1b2c";
    return result;
}

const Credential kTtls = credential(kEapMethodTtls);
const Credential kTls = credential(kEapMethodTls);

class Profiles : public testing::Test {
protected:
    NetworkProfile* add(const Credential& credential, const std::string& ssid = "cafe",
                        bool isForMachine = false, const std::wstring& domain = L"") {
        const Hs20Network network(Hs20BssRecord{{1, 2, 3, 4, 5, 6}, ssid, 1, 2, 1});
        NetworkProfile* added = nullptr;
        const ResultCode result =
            m_profiles.addProfileFromCredential(credential, network, isForMachine, domain, added);
        EXPECT_EQ(result, added == nullptr ? kFailure : kSuccess);
        return added;
    }

    // "name id/place" of these profiles.
    std::string shown(const std::string& names) {
        std::string text;
        NetworkProfile* found = nullptr;
        for (const char name : names)
            if (m_profiles.findProfileByName(std::wstring(1, static_cast<wchar_t>(name)), found) == kSuccess)
                text += name + std::to_string(found->m_id) + "/" + std::to_string(found->m_priority) + " ";
        return text;
    }

    NetworkProfileMgr m_profiles;
};

TEST_F(Profiles, HaveTheirTextToTheLastCharacter) {
    struct Case {
        const char* what;
        Credential credential;
        std::string ssid;
        std::wstring text;
        bool isForMachine = false;
        std::wstring domain = L"";
    };
    Credential odd = kTtls;
    odd.m_username = L"a<b>&\"'%s";
    odd.m_password = L"%d\u20AC\U0001F511 ";
    const Replacements oddly{{L"someone", odd.m_username},
                             {L"secret", odd.m_password},
                             {L"<domain>", L"<domain>%s"},
                             {L"cafe", L"<&>%s"},
                             {L"63616665", L"3c263e2573"}};
    const Case cases[] = {
        {"a password", kTtls, "cafe", kTtlsProfile},
        {"a password is never for the machine", kTtls, "cafe", kTtlsProfile, true},
        {"text that means something to XML and to printf", odd, "<&>%s", with(oddly), false, L"%s"},
        {"a certificate", kTls, "cafe", tlsProfile(), false, L"home.example"},
        {"the machine's own", kTls, "cafe", with({{L">machineOrUser<", L">machine<"}}, tlsProfile()), true},
        {"bytes that are no ASCII", kTtls, "caf\xC3\xFF",
         with({{L"cafe", L"caf\u00C3\u00FF"}, {L"63616665", L"636166c3ff"}})},
    };
    for (const Case& c : cases) {
        const NetworkProfile* const added = add(c.credential, c.ssid, c.isForMachine, c.domain);
        ASSERT_NE(added, nullptr) << c.what;
        EXPECT_EQ(added->m_profileXml, c.text) << c.what;
    }
}

TEST_F(Profiles, AreCutWhereALimitIsTheirOwnOrThatOfTheirInnerText) {
    constexpr std::size_t kLimit = 5119;
    const std::size_t eapFrom = kTtlsProfile.find(L"<EapHostConfig");
    const std::wstring tail = kTtlsProfile.substr(kTtlsProfile.find(L"</EAPConfig>"));
    for (const std::size_t length : {3700U, 4400U, 4478U, 4479U, 4480U, 6000U}) {
        Credential longest = kTtls;
        longest.m_password = std::wstring(length, L'x');
        const std::wstring whole = with({{L"secret", longest.m_password}});
        const std::wstring eap =
            whole.substr(eapFrom, whole.size() - eapFrom - tail.size()).substr(0, kLimit);
        const NetworkProfile* const added = add(longest);
        ASSERT_NE(added, nullptr) << length;
        EXPECT_EQ(added->m_profileXml, (whole.substr(0, eapFrom) + eap + tail).substr(0, kLimit)) << length;
    }
}

TEST_F(Profiles, RefuseACredentialOrANetworkThatGivesNone) {
    Credential unnamed = kTtls;
    unnamed.m_username.clear();
    const std::string fails = "Add network profile from credential failed.\n";
    const std::tuple<Credential, std::string, std::string> cases[] = {
        {credential(kEapMethodTtls, 0), "cafe", "ERROR: Invalid credential id=0\n"},
        {kTtls, "", "ERROR: Invalid BSS.\n"},
        {credential(3), "cafe", "Unexpected EAP method.\n" + fails},
        {unnamed, "cafe", "Adding a new EAP-TTLS network profile...\n\tUsername=, password=secret\n" + fails},
    };
    LogCapture log;
    for (const auto& [refused, ssid, lines] : cases) {
        EXPECT_EQ(add(refused, ssid), nullptr) << lines;
        EXPECT_EQ(log.text(), lines);
    }
}

TEST_F(Profiles, TakeTheNextNumberAboveTheHighestAndTheFirstPlace) {
    for (const char* ssid : {"a", "b", "c"})
        add(kTtls, ssid);
    EXPECT_EQ(shown("abc"), "a1/3 b2/2 c3/1 ");
    EXPECT_TRUE(m_profiles.deleteProfile(3));
    EXPECT_EQ(shown("abc"), "a1/2 b2/1 ");
    add(kTtls, "d");
    EXPECT_TRUE(m_profiles.deleteProfile(1));
    EXPECT_EQ(shown("abd"), "b2/2 d3/1 ");
    add(kTtls, "e");
    EXPECT_EQ(shown("bde"), "b2/3 d3/2 e4/1 ") << "a lower number stays unused";
    EXPECT_FALSE(m_profiles.deleteProfile(0));
    EXPECT_TRUE(m_profiles.deleteProfile(9));
    EXPECT_EQ(shown("bde"), "b2/3 d3/2 e4/1 ");
}

TEST_F(Profiles, GoWithTheirCredential) {
    add(credential(kEapMethodTtls, 5), "a");
    add(credential(kEapMethodTtls, 6), "b");
    add(credential(kEapMethodTls, 5), "c");
    LogCapture log;
    EXPECT_EQ(m_profiles.deleteProfilesOfCredential(5), kSuccess);
    EXPECT_EQ(log.text(),
              "Cred id=5 deleted, removing profile name=c\nCred id=5 deleted, removing profile name=a\n");
    EXPECT_EQ(shown("abc"), "b2/1 ");
    EXPECT_EQ(m_profiles.deleteProfilesOfCredential(0), kInvalidArgument);
    EXPECT_EQ(log.text(), "ERROR: Invalid credential id=0\n");
}

}  // namespace
}  // namespace vexa::test

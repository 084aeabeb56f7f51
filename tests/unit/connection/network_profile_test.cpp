#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>

#include "config/ResultCodes.h"
#include "connection/NetworkProfileMgr.h"
#include "unit/hotspot/LogCapture.h"

namespace vexa::test {
namespace {

// The text of a profile, written down by itself: one piece for each line of the schema.
const std::wstring kHost = L"http://www.microsoft.com";

std::wstring spaced(const std::wstring& name, const std::wstring& path) {
    return L"<" + name + L" xmlns=\"" + kHost + path + L"\">";
}

std::wstring element(const std::wstring& name, const std::wstring& text) {
    return L"<" + name + L">" + text + L"</" + name + L">";
}

std::wstring tabs(int count) {
    return std::wstring(static_cast<std::size_t>(count), L'\t');
}

std::wstring hexOf(const std::string& ssid) {
    std::wstring hex;
    for (const char c : ssid) {
        char digits[3];
        std::snprintf(digits, sizeof digits, "%02x", static_cast<unsigned char>(c));
        hex += std::wstring(digits, digits + 2);
    }
    return hex;
}

std::wstring methodHead(const std::wstring& type, const std::wstring& author) {
    const std::wstring common = L"/provisioning/EapCommon";
    return spaced(L"EapHostConfig", L"/provisioning/EapHostConfig") + tabs(1) + L"<EapMethod>" + tabs(2) +
           spaced(L"Type", common) + type + L"</Type>" + tabs(2) + spaced(L"VendorId", common) +
           L"0</VendorId>" + tabs(2) + spaced(L"VendorType", common) + L"0</VendorType>" + tabs(2) +
           spaced(L"AuthorId", common) + author + L"</AuthorId>" + tabs(1) + L"</EapMethod>" + tabs(1) +
           spaced(L"Config", L"/provisioning/EapHostConfig");
}

std::wstring ttlsPart(const std::wstring& user, const std::wstring& password, const std::wstring& domain) {
    return methodHead(L"21", L"9442") + tabs(2) + L"<ConnData>" + tabs(3) + element(L"username", user) +
           tabs(3) + element(L"password", password) + tabs(3) + element(L"domain", domain) + tabs(3) +
           element(L"identity", L"anonymous") + tabs(2) + L"</ConnData>" + tabs(1) +
           L"</Config></EapHostConfig>";
}

std::wstring tlsPart(const std::wstring& caCert) {
    const std::wstring second = L"/provisioning/EapTlsConnectionPropertiesV2";
    return methodHead(L"13", L"0") + tabs(2) +
           spaced(L"Eap", L"/provisioning/BaseEapConnectionPropertiesV1") + tabs(3) +
           element(L"Type", L"13") + tabs(3) +
           spaced(L"EapType", L"/provisioning/EapTlsConnectionPropertiesV1") + tabs(4) +
           L"<CredentialsSource>" + tabs(5) + L"<CertificateStore>" + tabs(6) +
           element(L"SimpleCertSelection", L"true") + tabs(5) + L"</CertificateStore>" + tabs(4) +
           L"</CredentialsSource>" + tabs(4) + L"<ServerValidation>" + tabs(5) +
           element(L"DisableUserPromptForServerValidation", L"true") + tabs(5) +
           element(L"ServerNames", L"") + tabs(5) + element(L"TrustedRootCA", caCert) + tabs(4) +
           L"</ServerValidation>" + tabs(4) + element(L"DifferentUsername", L"false") + tabs(4) +
           spaced(L"PerformServerValidation", second) + L"true</PerformServerValidation>" + tabs(4) +
           spaced(L"AcceptServerName", second) + L"false</AcceptServerName>" + tabs(3) + L"</EapType>" +
           tabs(2) + L"</Eap>" + tabs(1) + L"</Config></EapHostConfig>";
}

std::wstring profile(const std::string& ssid, const std::wstring& authMode, const std::wstring& eap) {
    std::wstring name;
    for (const char c : ssid)
        name += static_cast<wchar_t>(static_cast<unsigned char>(c));
    return L"<?xml version=\"1.0\"?>" + spaced(L"WLANProfile", L"/networking/WLAN/profile/v1") + L" " +
           tabs(1) + element(L"name", name) + tabs(1) + L"<SSIDConfig>" + tabs(2) + L"<SSID>" + tabs(3) +
           element(L"hex", hexOf(ssid)) + tabs(3) + element(L"name", name) + tabs(2) + L"</SSID>" + tabs(2) +
           element(L"nonBroadcast", L"false") + tabs(1) + L"</SSIDConfig>" + tabs(1) +
           element(L"connectionType", L"ESS") + tabs(1) + element(L"connectionMode", L"auto") + tabs(1) +
           element(L"autoSwitch", L"false") + tabs(1) + L"<MSM>" + tabs(2) + L"<security> " + tabs(3) +
           L"<authEncryption> " + tabs(4) + element(L"authentication", L"WPA2") + L" " + tabs(4) +
           element(L"encryption", L"AES") + L" " + tabs(4) + element(L"useOneX", L"true") + L" " + tabs(3) +
           L"</authEncryption> " + tabs(3) + spaced(L"OneX", L"/networking/OneX/v1") + L" " + tabs(4) +
           element(L"cacheUserData", L"false") + tabs(4) + element(L"authMode", authMode) + tabs(4) +
           element(L"EAPConfig", eap) + L" " + tabs(3) + L"</OneX> " + tabs(2) + L"</security> " + tabs(1) +
           L"</MSM> </WLANProfile>";
}

class Profiles : public testing::Test {
protected:
    Profiles() ACQUIRE(g_hs20Lock) { g_hs20Lock.lock(); }
    ~Profiles() override RELEASE(g_hs20Lock) { g_hs20Lock.unlock(); }

    static Credential ttls(std::int32_t id = 1) {
        Credential credential(id, L"PC\\user", CRED_TYPE_EAP_TTLS, CRED_ACCESS_ALL_USER);
        credential.m_eapMethod = kEapMethodTtls;
        credential.m_username = L"someone";
        credential.m_password = L"secret";
        return credential;
    }

    static Credential tls(std::int32_t id = 1) {
        Credential credential(id, L"PC\\user", CRED_TYPE_EAP_TLS, CRED_ACCESS_ALL_USER);
        credential.m_eapMethod = kEapMethodTls;
        credential.m_caCert = L"0a1b2c";
        credential.m_clientCert = L"mine";
        return credential;
    }

    static Hs20Network network(const std::string& ssid) {
        return Hs20Network(Hs20BssRecord{{1, 2, 3, 4, 5, 6}, ssid, 1, 2, 1});
    }

    NetworkProfile* add(const Credential& credential, const std::string& ssid = "cafe",
                        bool isForMachine = false, const std::wstring& domain = L"") REQUIRES(g_hs20Lock) {
        NetworkProfile* added = nullptr;
        m_result =
            m_profiles.addProfileFromCredential(credential, network(ssid), isForMachine, domain, added);
        return added;
    }

    NetworkProfile* find(const std::wstring& name) REQUIRES(g_hs20Lock) {
        NetworkProfile* found = nullptr;
        m_profiles.findProfileByName(name, found);
        return found;
    }

    NetworkProfileMgr m_profiles;
    ResultCode m_result = kNotFound;
};

TEST_F(Profiles, HaveTheirTextToTheLastCharacter) {
    struct Case {
        const char* what;
        Credential credential;
        std::string ssid;
        bool isForMachine;
        std::wstring domain;
        std::wstring text;
    };
    Credential odd = ttls();
    odd.m_username = L"a<b>&\"'%s";
    odd.m_password = L"%d\u20AC\U0001F511 ";
    Credential bare = tls();
    bare.m_caCert.clear();
    const std::string bytes = "caf\xC3\xA9\x80\xFF";
    const std::string longest = "0123456789abcdef0123456789ABCDEF";
    const Case cases[] = {
        {"a password", ttls(), "cafe", false, L"",
         profile("cafe", L"machineOrUser", ttlsPart(L"someone", L"secret", L""))},
        {"a password is never for the machine", ttls(), "cafe", true, L"",
         profile("cafe", L"machineOrUser", ttlsPart(L"someone", L"secret", L""))},
        {"a home realm", ttls(), "cafe", false, L"home.example",
         profile("cafe", L"machineOrUser", ttlsPart(L"someone", L"secret", L"home.example"))},
        {"text that means something to XML and to printf", odd, "<&>%s", false, L"%s",
         profile("<&>%s", L"machineOrUser", ttlsPart(odd.m_username, odd.m_password, L"%s"))},
        {"a certificate", tls(), "cafe", false, L"home.example",
         profile("cafe", L"machineOrUser", tlsPart(L"0a1b2c"))},
        {"the machine's certificate", tls(), "cafe", true, L"",
         profile("cafe", L"machine", tlsPart(L"0a1b2c"))},
        {"no authority", bare, "cafe", false, L"", profile("cafe", L"machineOrUser", tlsPart(L""))},
        {"bytes that are no ASCII", tls(), bytes, false, L"",
         profile(bytes, L"machineOrUser", tlsPart(L"0a1b2c"))},
        {"32 bytes", ttls(), longest, false, L"",
         profile(longest, L"machineOrUser", ttlsPart(L"someone", L"secret", L""))},
    };
    for (const Case& c : cases) {
        m_profiles.clear();
        const NetworkProfile* const added = add(c.credential, c.ssid, c.isForMachine, c.domain);
        ASSERT_NE(added, nullptr) << c.what;
        EXPECT_EQ(added->m_profileXml, c.text) << c.what;
    }
}

TEST_F(Profiles, AreCutWhereALimitIsTheirOwnOrThatOfTheirInnerText) {
    constexpr std::size_t kLimit = 5119;
    for (const std::size_t length : {3000U, 3700U, 4400U, 4478U, 4479U, 4480U, 6000U}) {
        m_profiles.clear();
        Credential credential = ttls();
        credential.m_password = std::wstring(length, L'x');
        const std::wstring eap = ttlsPart(L"someone", credential.m_password, L"").substr(0, kLimit);
        const NetworkProfile* const added = add(credential);
        ASSERT_NE(added, nullptr) << length;
        EXPECT_EQ(added->m_profileXml, profile("cafe", L"machineOrUser", eap).substr(0, kLimit)) << length;
    }
}

TEST_F(Profiles, HoldWhatTheyWereMadeOf) {
    const NetworkProfile* const first = add(ttls(7));
    EXPECT_EQ(m_result, kSuccess);
    EXPECT_EQ(first->m_name, L"cafe");
    EXPECT_EQ(first->m_eapMethod, kEapMethodTtls);
    EXPECT_FALSE(first->m_bMachineAuth);
    EXPECT_EQ(first->m_credId, 7);
    const NetworkProfile* const second = add(tls(8), "b\x80", true);
    EXPECT_EQ(second->m_name, L"b\x80");
    EXPECT_EQ(second->m_eapMethod, kEapMethodTls);
    EXPECT_TRUE(second->m_bMachineAuth);
    EXPECT_EQ(find(L"b\x80"), second);
    EXPECT_EQ(find(L"B\x80"), nullptr);
    EXPECT_EQ(find(L"caf"), nullptr);
    EXPECT_EQ(find(L"cafe"), first);
}

TEST_F(Profiles, RefuseACredentialOrANetworkThatGivesNone) {
    struct Case {
        const char* what;
        Credential credential;
        std::string ssid;
        std::string log;
    };
    Credential nameless = ttls();
    nameless.m_username.clear();
    Credential sim = ttls();
    sim.m_eapMethod = 3;
    const std::string failed = "Add network profile from credential failed.\n";
    const Case cases[] = {
        {"id 0", ttls(0), "cafe", "ERROR: Invalid credential id=0\n"},
        {"id -1", tls(-1), "cafe", "ERROR: Invalid credential id=-1\n"},
        {"no name", ttls(), "", "ERROR: Invalid BSS.\n"},
        {"another method", sim, "cafe", "Unexpected EAP method.\n" + failed},
        {"no user", nameless, "cafe",
         "Adding a new EAP-TTLS network profile...\n\tUsername=, password=secret\n" + failed},
    };
    add(ttls(), "other");
    LogCapture log;
    for (const Case& c : cases) {
        EXPECT_EQ(add(c.credential, c.ssid), nullptr) << c.what;
        EXPECT_EQ(m_result, kFailure) << c.what;
        EXPECT_EQ(log.text(), c.log) << c.what;
    }
    EXPECT_EQ(add(ttls(), "cafe")->m_id, 2);
}

TEST_F(Profiles, TellTheLogWhatTheyAreMadeFor) {
    LogCapture log;
    add(ttls());
    add(tls(), "a");
    add(tls(), "b", true);
    EXPECT_EQ(log.text(),
              "Adding a new EAP-TTLS network profile...\n\tUsername=someone, password=secret\n"
              "Adding a new EAP-TLS network profile with auth mode=machineOrUser...\n"
              "Adding a new EAP-TLS network profile with auth mode=machine...\n");
}

TEST_F(Profiles, TakeTheNextNumberAboveTheHighestAndTheFirstPlace) {
    for (const char* ssid : {"a", "b", "c"})
        add(ttls(), ssid);
    EXPECT_EQ(find(L"a")->m_id, 1);
    EXPECT_EQ(find(L"c")->m_id, 3);
    EXPECT_EQ(find(L"a")->m_priority, 3);
    EXPECT_EQ(find(L"b")->m_priority, 2);
    EXPECT_EQ(find(L"c")->m_priority, 1);

    EXPECT_TRUE(m_profiles.deleteProfile(3));
    EXPECT_EQ(find(L"b")->m_priority, 1);
    EXPECT_EQ(find(L"a")->m_priority, 2);
    EXPECT_EQ(add(ttls(), "d")->m_id, 3) << "the highest had gone";

    EXPECT_TRUE(m_profiles.deleteProfile(1));
    EXPECT_EQ(find(L"b")->m_priority, 2);
    EXPECT_EQ(find(L"d")->m_priority, 1);
    EXPECT_EQ(add(ttls(), "e")->m_id, 4) << "a lower one stays unused";
}

// The same additions and removals on a plain list.
TEST_F(Profiles, KeepTheirPlacesAsAListWithTheNewestInFrontDoes) {
    std::uint32_t state = 1;
    const auto random = [&state](std::uint32_t below) {
        return (state = state * 1664525 + 1013904223) / 65536 % below;
    };
    std::vector<std::pair<std::int32_t, std::wstring>> model;  // the first place first
    for (int step = 0; step < 3000; ++step) {
        const std::wstring name(1, static_cast<wchar_t>(L'a' + random(12)));
        const auto held =
            std::find_if(model.begin(), model.end(), [&](const auto& p) { return p.second == name; });
        if (held != model.end()) {
            ASSERT_TRUE(m_profiles.deleteProfile(held->first));
            model.erase(held);
        } else {
            std::int32_t highest = 0;
            for (const auto& [id, taken] : model)
                highest = std::max(highest, id);
            add(ttls(), std::string(name.begin(), name.end()));
            model.insert(model.begin(), {highest + 1, name});
        }
        for (std::size_t place = 0; place < model.size(); ++place) {
            const NetworkProfile* const found = find(model[place].second);
            ASSERT_NE(found, nullptr) << step;
            ASSERT_EQ(found->m_id, model[place].first) << step;
            ASSERT_EQ(found->m_priority, static_cast<std::int32_t>(place) + 1) << step;
        }
    }
}

TEST_F(Profiles, DeleteSaysFalseForNumbersThatNoProfileHas) {
    add(ttls());
    EXPECT_FALSE(m_profiles.deleteProfile(0));
    EXPECT_FALSE(m_profiles.deleteProfile(-1));
    EXPECT_TRUE(m_profiles.deleteProfile(2));
    EXPECT_NE(find(L"cafe"), nullptr);
}

TEST_F(Profiles, GoWithTheirCredential) {
    add(ttls(5), "a");
    add(ttls(6), "b");
    add(tls(5), "c");
    LogCapture log;
    EXPECT_EQ(m_profiles.deleteProfilesOfCredential(5), kSuccess);
    EXPECT_EQ(log.text(),
              "Cred id=5 deleted, removing profile name=c\nCred id=5 deleted, removing profile name=a\n");
    EXPECT_EQ(find(L"a"), nullptr);
    EXPECT_EQ(find(L"c"), nullptr);
    EXPECT_EQ(find(L"b")->m_priority, 1);
    EXPECT_EQ(m_profiles.deleteProfilesOfCredential(0), kInvalidArgument);
    EXPECT_EQ(log.text(), "ERROR: Invalid credential id=0\n");
}

}  // namespace
}  // namespace vexa::test

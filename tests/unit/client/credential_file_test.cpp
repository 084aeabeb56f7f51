#include "client/import/CredentialFile.h"

#include <gtest/gtest.h>

#include "client/import/Base64.h"
#include "client/import/Certificate.h"
#include "client/import/OwnFormat.h"
#include "client/import/Sha1.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {
namespace {

constexpr const char* kRoot =
    "MIIBYzCCAQigAwIBAgIBATAKBggqhkjOPQQDAjAPMQ0wCwYDVQQDDARSb290MCAXDTI2MTEyNTE3MjkwN1oYDzIxMjYxMTAxMTcyOTA3"
    "WjAPMQ0wCwYDVQQDDARSb290MFkwEwYHKoZIzj0CAQYIKoZIzj0DAQcDQgAE+LQ7mJknaPc4RuGV0/gLt9mhdyXbnX8cVTGkTe4Hd79F"
    "J75f+IqBrQTkGKWBK2hxpb5y5NcL9Tda4dgeMSkhIKNTMFEwHQYDVR0OBBYEFNyRgPZcTChC0yjixwhn7qzhkU0IMB8GA1UdIwQYMBaA"
    "FNyRgPZcTChC0yjixwhn7qzhkU0IMA8GA1UdEwEB/wQFMAMBAf8wCgYIKoZIzj0EAwIDSQAwRgIhAO/KWzbr0oURUsqum06lvpaudXU7"
    "RyeimxD/fW0t++hRAiEAzY9J3gr4rmOXTn7oOfuBFZ0cE6tZSxnGclWLeqjEXNE=";
constexpr const char* kThumbprint = "1b 14 dd 2f d7 9f aa 9f 3a bf 27 3e 04 e5 4e 38 51 c5 e2 b3";

std::string pem(const std::string& base64) {
    return "-----BEGIN CERTIFICATE-----\n" + base64 + "\n-----END CERTIFICATE-----\n";
}

std::string list(const std::string& providers) {
    return "<EAPIdentityProviderList>" + providers + "</EAPIdentityProviderList>";
}

std::string provider(const std::string& methods, const std::string& rest = "") {
    return list("<EAPIdentityProvider><AuthenticationMethods><AuthenticationMethod>" + methods +
                "</AuthenticationMethod></AuthenticationMethods>" + rest + "</EAPIdentityProvider>");
}

/// All credentials, as in "TTLS r u/p"; then the notes.
std::string told(const std::string& file) {
    std::string text;
    const CredentialFile read = readCredentialFile(file);
    for (const auto& [credential, provider, suffix] : read.credentials) {
        text += methodName(credential) + " " + credential.realm + " " + credential.username + "/" +
                credential.password + suffix + credential.caCert + "\n";
    }
    for (const std::string& note : read.notes)
        text += note + "\n";
    return text;
}

std::string refusal(const std::string& file) try {
    return "read: " + told(file);
} catch (const ClientError& error) {
    return error.what();
}

TEST(Base64, IsReadStrictly) {
    const std::tuple<const char*, std::optional<std::string>> cases[] = {
        {"", ""},     {"Zg==", "f"}, {"Zm8=", "fo"}, {" Zm9\nv\t", "foo"}, {"+/+/", "\xFB\xFF\xBF"},
        {"Zg=", {}},  {"Zg", {}},    {"Z===", {}},   {"Zh==", {}},         {"Zg==Zg==", {}},
        {"Zm9-", {}}, {"====", {}},  {"Zm9v=", {}},
    };
    for (const auto& [text, bytes] : cases)
        EXPECT_EQ(decodeBase64(text), bytes) << text;
    EXPECT_EQ(decodeBase64(std::string_view("Zm9\0", 4)), std::nullopt);
}

TEST(Sha1, IsThatOfOthersAtTheEdgesOfABlock) {
    const std::tuple<std::size_t, const char*> cases[] = {
        {0, "da39a3ee5e6b4b0d3255bfef95601890afd80709"},   {3, "7e240de74fb1ed08fa08d38063f6a6a91462a815"},
        {55, "c1c8bbdc22796e28c0e15163d20899b65621d65a"},  {56, "c2db330f6083854c99d4b5bfb6e8f29f201be699"},
        {63, "03f09f5b158a7a8cdad920bddc29b81c18a551f5"},  {64, "0098ba824b5c16427bd7a1122a5a442a25ec644d"},
        {119, "ee971065aaa017e0632a8ca6c77bb3bf8b1dfc56"}, {120, "f34c1488385346a55709ba056ddd08280dd4c6d6"},
        {200, "e61cfffe0d9195a525fc6cf06ca2d77119c24a40"},
    };
    for (const auto& [length, hex] : cases) {
        std::string text;
        for (const std::uint8_t byte : sha1(std::string(length, 'a')))
            text += {"0123456789abcdef"[byte >> 4], "0123456789abcdef"[byte & 15]};
        EXPECT_EQ(text, hex) << length;
    }
}

TEST(Certificate, IsReadInBothFormsAndWholeOrNotAtAll) {
    const std::string der = decodeBase64(kRoot).value();
    EXPECT_EQ(readCertificates(kRoot).at(0).thumbprint, kThumbprint);
    EXPECT_TRUE(readCertificates(kRoot).at(0).isSelfIssued);
    EXPECT_EQ(readCertificates(pem(kRoot) + pem(kRoot)).size(), 2);
    for (const std::string& text : {std::string(), std::string("AAAA"), pem("AAAA"), pem(kRoot) + pem("!"),
                                    pem(kRoot).substr(0, 400), std::string(kRoot).substr(0, 476),
                                    std::string("MIT/////"), std::string("MA=="), std::string(kRoot) + "!"})
        EXPECT_TRUE(readCertificates(text).empty()) << text;
}

// A method's client side, and what comes of it.
TEST(EapMetadata, BecomesCredentialsAndALineForWhatTheyCannotHold) {
    const std::string ttls = "<EAPMethod><Type>21</Type></EAPMethod>",
                      tls = "<EAPMethod><Type>13</Type></EAPMethod>";
    const std::string realm =
        "<ClientSideCredential><InnerIdentitySuffix>r</InnerIdentitySuffix></ClientSideCredential>";
    const auto inner = [](const char* kind, int type, const std::string& more = "") {
        return "<InnerAuthenticationMethod><" + std::string(kind) + "><Type>" + std::to_string(type) +
               "</Type></" + kind + ">" + more + "</InnerAuthenticationMethod>";
    };
    const auto client = [](const std::string& text) {
        return "<ClientSideCredential>" + text + "</ClientSideCredential>";
    };
    const auto ca = [](const std::string& text) {
        return "<ServerSideCredential><CA>" + text + "</CA></ServerSideCredential>";
    };
    const std::string chooses = " is not kept: the adapter's software chooses it\n";
    const std::tuple<std::string, std::string> cases[] = {
        {ttls + realm, "TTLS r /\n"},
        {ttls + realm + inner("NonEAPAuthMethod", 3), "TTLS r /\n\"\": the inner method MSCHAPv2" + chooses},
        {ttls + inner("EAPMethod", 26, realm), "TTLS r /\n\"\": the inner method EAP-MSCHAPv2" + chooses},
        {ttls + realm + inner("EAPMethod", 6),
         "\"\": EAP-TTLS with EAP-GTC is not kept: the service has it with PAP and MSCHAPv2\n"},
        {ttls + client("<UserName>u@r</UserName><Password> p\n</Password>"), "TTLS r u@r/p\n"},
        {ttls + client("<UserName>u</UserName><OuterIdentity>anonymous@o</OuterIdentity>"), "TTLS o u/\n"},
        {ttls + client("<UserName>u@\u0142</UserName>"),
         "\"\": EAP-TTLS is not kept: its realm holds a character beyond Latin-1, which no network's can be "
         "compared with\n"},
        {ttls + client("<UserName>u</UserName>"), "\"\": EAP-TTLS is not kept: it names no realm\n"},
        {ttls + client("<InnerIdentitySuffix>" + std::string(128, 'r') + "</InnerIdentitySuffix>"),
         "\"\": EAP-TTLS is not kept: the name is longer than 127 characters\n"},
        {ttls +
             client(
                 "<InnerIdentitySuffix>@<![CDATA[r]]></InnerIdentitySuffix><InnerIdentityHint>1</InnerIdentityHint>"),
         "TTLS r /@r\n"},
        {tls + realm, "TLS r /\n"},
        {tls + realm + ca(pem(kRoot)), std::string("TLS r /") + kThumbprint + "\n"},
        {tls + realm + ca("AAA"),
         "\"\": a CA is not kept: no certificate can be read in it\n"
         "\"\": EAP-TLS is not kept: its authority is not known, and without one any server would do\n"},
        {"<x:EAPMethod xmlns:x='urn:x'><x:Type>4</x:Type></x:EAPMethod><Secret>s</Secret>",
         "\"\": the EAP method \"4\" is not kept: the service has EAP-TTLS and EAP-TLS\n"},
        {tls + realm + "<Odd><Deep>s</Deep></Odd><Empty/>",
         "TLS r /\n\"\": Odd is not kept: a credential has no place for it\n"},
    };
    for (const auto& [method, expected] : cases)
        EXPECT_EQ(told(provider(method)), expected) << method;
}

TEST(CredentialFile, OfAStrangerIsRefusedBeforeItCanDoHarm) {
    const auto repeated = [](std::size_t count, const std::string& text) {
        std::string all;
        for (std::size_t i = 0; i < count; ++i)
            all += text;
        return all;
    };
    const std::string laughs = "<!DOCTYPE l [<!ENTITY a \"ha\"><!ENTITY b \"&a;&a;\">]>" + list("&b;");
    const std::tuple<std::string, const char*> cases[] = {
        {"", "the file is neither EAP metadata nor what `vexa credential export` writes"},
        {"<!DOCTYPE EAPIdentityProviderList>" + list(""), "the file has a document type, which is refused"},
        {laughs, "the file has a document type, which is refused"},
        {list("&b;"), "the file is no well-formed XML in UTF-8"},
        {list("\xE9"), "the file is no well-formed XML in UTF-8"},
        {list("<a>"), "the file is no well-formed XML in UTF-8"},
        {list(std::string(2 << 20, ' ')), "the file is longer than 1 MiB"},
        {list(repeated(32, "<a>") + repeated(32, "</a>")), "the elements of the file are nested too deep"},
        {list(repeated(70000, "<a>") + repeated(70000, "</a>")),
         "the elements of the file are nested too deep"},
        {list("<a " + repeated(10001, "b='' ") + "/>"), "the file has too many attributes"},
        {"<WLANProfile/>", "the file is no EAP metadata: its root is \"WLANProfile\""},
        {repeated(5000, "{\"a\":"), "the file is no JSON that `vexa credential export` writes"},
        {"{\"format\": \"vexa-credentials\", \"version\": 2}",
         "the file is of a version that is not known: 2"},
        {"\xEF\xBB\xBF" + list(repeated(30, "<a>") + repeated(30, "</a>")), "read: "},
    };
    for (const auto& [text, reason] : cases)
        EXPECT_EQ(refusal(text), reason) << text.substr(0, 100);
}

TEST(CredentialFile, NamesTheMemberThatIsWrong) {
    const std::tuple<const char*, const char*> cases[] = {
        {"[]", "credentials[0] is no object"},
        {R"({"realm": "r"})", "credentials[0].method is none that is known"},
        {R"({"method": "TLS"})", "credentials[0].realm is missing"},
        {R"({"method": "TLS", "realm": 7})", "credentials[0].realm is no text"},
        {R"({"method": "TLS", "realm": "r", "autoConnect": 1})",
         "credentials[0].autoConnect is neither true nor false"},
        {R"({"method": "TLS", "realm": "r", "access": "me"})", "credentials[0].access is none that is known"},
        {R"({"method": "TLS", "realm": "r", "clientCert": "\u0007"})",
         "credentials[0]: the client certificate holds a control character"},
        {R"({"method": "TLS", "realm": "r", "password": "p"})",
         "read: TLS r /\ncredentials[0].password is not kept\n"},
    };
    for (const auto& [entry, reason] : cases) {
        const std::string file = R"({"format": "vexa-credentials", "version": 1, "credentials": [)";
        EXPECT_EQ(refusal(file + entry + "]}"), reason) << entry;
    }
}

}  // namespace
}  // namespace vexa::client

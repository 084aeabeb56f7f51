#include "client/hotspot/Credential.h"

#include <gtest/gtest.h>

#include "client/hotspot/CredentialText.h"
#include "client/hotspot/Fitting.h"

namespace vexa::client {
namespace {

Credential userCredential(int id, const std::string& name) {
    Credential credential;
    credential.id = id;
    credential.type = kTypeUser;
    credential.method = kMethodTtls;
    credential.access = kPerUser;
    credential.name = name;
    credential.realm = "realm";
    credential.username = "user";
    credential.password = "pässword";
    return credential;
}

TEST(CredentialText, NumbersKindsThatAreNotKnown) {
    Credential credential = userCredential(1, "n");
    credential.type = 2;
    credential.access = 9;
    const Json::Value object = credentialJson(credential, 4, Passwords::Hidden);
    EXPECT_EQ(object["method"].asString(), "type 2");
    EXPECT_EQ(object["access"].asString(), "9");
}

TEST(Fitting, RealmAndMethodStandBesideEachOther) {
    const auto stored = [](const char* name, int method, const char* realm, const char* password = "p") {
        Credential result = userCredential(1, name);
        result.method = method;
        result.realm = realm;
        result.password = password;
        return result;
    };
    const CredentialList all{stored("card", kMethodTls, "a"),  stored("phone", kMethodTtls, "a"),
                             stored("case", kMethodTtls, "A"), stored("half", kMethodTtls, "a", ""),
                             stored("late", kMethodTtls, "b"), stored("bare", kMethodTls, "b", ""),
                             stored("wide", kMethodTtls, "ä"), stored("bytes", kMethodTtls, "Ã¤"),
                             stored("none", kMethodTtls, ""),  stored("far", kMethodTtls, "空")};
    const std::tuple<std::vector<Network::Realm>, std::optional<int>, const char*> cases[] = {
        {{}, {}, ""},
        {{{kMethodTls, "a"}}, {}, "card"},
        {{{kMethodTtls, "a"}}, {}, "phone"},
        {{{kMethodTtls, "a"}, {kMethodTls, "a"}}, {}, "card or phone"},
        {{{kMethodTtls, "a"}, {kMethodTls, "a"}}, kMethodTtls, "phone"},
        {{{kMethodTtls, "b"}, {kMethodTls, "b"}, {kMethodTtls, "a"}}, {}, "phone, late or bare"},
        {{{kMethodTls, "a"}}, 0, ""},
        {{{kMethodTtls, "ä"}, {kMethodTtls, ""}, {kMethodTtls, "空"}}, {}, "bytes"},
    };
    for (const auto& [realms, method, names] : cases) {
        Network network;
        network.realms = realms;
        EXPECT_EQ(alternatives(credentialsBehind(all, network, method)), names);
    }
}

}  // namespace
}  // namespace vexa::client

#include "client/hotspot/Fitting.h"

#include <gtest/gtest.h>

namespace vexa::client {
namespace {

Credential credential(const char* name, int method, const char* realm, const char* password = "p") {
    Credential result;
    result.name = name;
    result.method = method;
    result.realm = realm;
    result.username = "u";
    result.password = password;
    return result;
}

const CredentialList kStored{credential("card", kMethodTls, "a"),  credential("phone", kMethodTtls, "a"),
                             credential("case", kMethodTtls, "A"), credential("half", kMethodTtls, "a", ""),
                             credential("late", kMethodTtls, "b"), credential("bare", kMethodTls, "b", "")};

TEST(Fitting, RealmAndMethodStandBesideEachOther) {
    struct Case {
        std::vector<Network::Realm> realms;
        std::optional<int> method;
        const char* names;
    };
    const std::vector<Case> cases{
        {{}, {}, ""},
        {{{kMethodTls, "a"}}, {}, "card"},
        {{{kMethodTtls, "a"}}, {}, "phone"},
        {{{kMethodTtls, "a"}, {kMethodTls, "a"}}, {}, "card or phone"},
        {{{kMethodTtls, "a"}, {kMethodTls, "a"}}, kMethodTtls, "phone"},
        {{{kMethodTtls, "b"}, {kMethodTls, "b"}, {kMethodTtls, "a"}}, {}, "phone, late or bare"},
        {{{kMethodTtls, "b"}, {kMethodTtls, "a"}}, kMethodTtls, "phone or late"},
        {{{kMethodTls, "a"}}, 0, ""},
        {{{kMethodTls, "a"}}, kMethodTtls, ""}};
    for (const Case& example : cases) {
        Network network;
        network.realms = example.realms;
        EXPECT_EQ(alternatives(credentialsBehind(kStored, network, example.method)), example.names);
    }
}

}  // namespace
}  // namespace vexa::client

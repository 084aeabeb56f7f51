#include "client/hotspot/Credential.h"

#include <gtest/gtest.h>

#include "client/hotspot/CredentialText.h"
#include "client/hotspot/Fitting.h"
#include "client/port/JsonLine.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {
namespace {

Credential userCredential(int id, const std::string& name) {
    Credential credential;
    credential.id = id;
    credential.type = kTypeUser;
    credential.method = kMethodTtls;
    credential.access = kPerUser;
    credential.autoConnect = true;
    credential.name = name;
    credential.realm = "realm";
    credential.creator = "creator";
    credential.username = "user";
    credential.password = "pässword";
    return credential;
}

TEST(Credential, WhatIsSentComesBackTheSameAndEntriesThatAreNoneAreLeftOut) {
    const Credential credential = userCredential(7, "A \"quoted\" 空港");
    Json::Value list = parseJson("[7, null, [], {}, {\"Id\": \"x\"}]").value();
    list.append(parseJson(credentialData(credential)).value());
    EXPECT_EQ(credentialList(list), CredentialList{credential});
    for (const char* text : {"null", "{}", "7", "[]"})
        EXPECT_TRUE(credentialList(parseJson(text).value()).empty()) << text;
}

TEST(Credential, IsFoundByIdOrOnlyName) {
    const CredentialList list{userCredential(3, "x"), userCredential(4, "3"), userCredential(5, "twice"),
                              userCredential(6, "twice")};
    EXPECT_EQ(findCredential(list, "x").id, 3);
    EXPECT_EQ(findCredential(list, "3").id, 3) << "an id goes before a name";
    EXPECT_EQ(findCredential(list, "4").id, 4);
    for (const char* unknown : {"", "twice", "nobody", "7", "3 ", "-3", "99999999999999"})
        EXPECT_THROW(findCredential(list, unknown), ClientError) << unknown;
    EXPECT_EQ(positionOf(list, 5), 3U);
}

TEST(Credential, TextThatTheServiceCannotStoreIsKnown) {
    const auto isStored = [](std::string Credential::*field, const std::string& text) {
        Credential credential = userCredential(1, "n");
        credential.*field = text;
        return !objectionTo(credential);
    };
    std::string sixtyTwo;  // UTF-16 units
    for (int i = 0; i < 31; ++i)
        sixtyTwo += "😀";
    for (const auto field :
         {&Credential::name, &Credential::realm, &Credential::clientCert, &Credential::caCert}) {
        EXPECT_TRUE(isStored(field, std::string(127, 'x')));
        EXPECT_FALSE(isStored(field, std::string(128, 'x')));
    }
    for (const auto field : {&Credential::username, &Credential::creator, &Credential::password}) {
        EXPECT_TRUE(isStored(field, sixtyTwo + "x"));
        EXPECT_FALSE(isStored(field, sixtyTwo + "😀"));
    }
    EXPECT_TRUE(isStored(&Credential::realm, " <&>\"' "));
    for (const char* text : {"a\tb", "a\x7F", "caf\xE9"})
        EXPECT_FALSE(isStored(&Credential::password, text)) << text;
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
                             stored("late", kMethodTtls, "b"), stored("bare", kMethodTls, "b", "")};
    struct Case {
        std::vector<Network::Realm> realms;
        std::optional<int> method;
        const char* names;
    };
    const Case cases[] = {
        {{}, {}, ""},
        {{{kMethodTls, "a"}}, {}, "card"},
        {{{kMethodTtls, "a"}}, {}, "phone"},
        {{{kMethodTtls, "a"}, {kMethodTls, "a"}}, {}, "card or phone"},
        {{{kMethodTtls, "a"}, {kMethodTls, "a"}}, kMethodTtls, "phone"},
        {{{kMethodTtls, "b"}, {kMethodTls, "b"}, {kMethodTtls, "a"}}, {}, "phone, late or bare"},
        {{{kMethodTls, "a"}}, 0, ""},
    };
    for (const Case& c : cases) {
        Network network;
        network.realms = c.realms;
        EXPECT_EQ(alternatives(credentialsBehind(all, network, c.method)), c.names);
    }
}

}  // namespace
}  // namespace vexa::client

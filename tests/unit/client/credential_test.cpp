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

TEST(Credential, WhatIsSentComesBackTheSame) {
    const Credential credential = userCredential(7, "A \"quoted\" 空港");
    const auto data = parseJson(credentialData(credential));
    ASSERT_TRUE(data);
    Json::Value list(Json::arrayValue);
    list.append(*data);
    EXPECT_EQ(credentialList(list), CredentialList{credential});
}

TEST(Credential, EntriesThatAreNoneAreLeftOut) {
    Json::Value list = *parseJson("[7, null, [], {}, {\"Id\": \"x\"}]");
    list.append(*parseJson(credentialData(userCredential(1, "a"))));
    ASSERT_EQ(credentialList(list).size(), 1U);
    for (const char* text : {"null", "{}", "7", "[]"})
        EXPECT_TRUE(credentialList(*parseJson(text)).empty()) << text;
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
    struct Case {
        std::string Credential::*field;
        std::string text;
        bool isStored;
    };
    std::string sixtyTwo;  // UTF-16 units
    for (int i = 0; i < 31; ++i)
        sixtyTwo += "😀";
    for (const auto& [field, text, isStored] : {Case{&Credential::name, std::string(127, 'x'), true},
                                                {&Credential::name, std::string(128, 'x'), false},
                                                {&Credential::realm, std::string(128, 'x'), false},
                                                {&Credential::clientCert, std::string(128, 'x'), false},
                                                {&Credential::caCert, std::string(127, 'x'), true},
                                                {&Credential::username, std::string(63, 'x'), true},
                                                {&Credential::username, std::string(64, 'x'), false},
                                                {&Credential::creator, std::string(64, 'x'), false},
                                                {&Credential::password, sixtyTwo + "x", true},
                                                {&Credential::password, sixtyTwo + "😀", false},
                                                {&Credential::password, "a\tb", false},
                                                {&Credential::password, "a\x7F", false},
                                                {&Credential::realm, "caf\xE9", false},
                                                {&Credential::realm, " <&>\"' ", true}}) {
        Credential credential = userCredential(1, "n");
        credential.*field = text;
        EXPECT_EQ(!objectionTo(credential), isStored) << text;
    }
}

TEST(CredentialText, HidesPasswordsUnlessAskedAndNumbersKindsThatAreNotKnown) {
    Credential credential = userCredential(1, "n");
    for (const auto passwords : {Passwords::Hidden, Passwords::Shown}) {
        const std::string table = credentialTable({credential}, passwords)[1];
        const std::string json = jsonLine(credentialsJson({credential}, passwords));
        for (const std::string& text : {table, json})
            EXPECT_EQ(text.find("pässword") != std::string::npos, passwords == Passwords::Shown) << text;
    }
    credential.type = 2;
    credential.access = 9;
    const Json::Value object = credentialJson(credential, 4, Passwords::Hidden);
    EXPECT_EQ(object["method"].asString(), "type 2");
    EXPECT_EQ(object["access"].asString(), "9");
    EXPECT_EQ(object["position"].asInt(), 4);
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

#include "client/hotspot/Credential.h"

#include <gtest/gtest.h>

#include "client/hotspot/CredentialText.h"
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
    const std::string smile = "😀";
    std::string sixtyThree;
    for (int i = 0; i < 31; ++i)
        sixtyThree += smile;
    for (const Case& example :
         {Case{&Credential::name, std::string(127, 'x'), true},
          Case{&Credential::name, std::string(128, 'x'), false},
          Case{&Credential::realm, std::string(128, 'x'), false},
          Case{&Credential::clientCert, std::string(128, 'x'), false},
          Case{&Credential::caCert, std::string(127, 'x'), true},
          Case{&Credential::username, std::string(63, 'x'), true},
          Case{&Credential::username, std::string(64, 'x'), false},
          Case{&Credential::creator, std::string(64, 'x'), false},
          Case{&Credential::password, sixtyThree + "x", true},
          Case{&Credential::password, sixtyThree + smile, false}, Case{&Credential::password, "a\tb", false},
          Case{&Credential::password, "a\x7F", false}, Case{&Credential::realm, "caf\xE9", false},
          Case{&Credential::realm, " <&>\"' ", true}}) {
        Credential credential = userCredential(1, "n");
        credential.*example.field = example.text;
        EXPECT_EQ(!objectionTo(credential), example.isStored) << example.text;
    }
}

TEST(CredentialText, HidesPasswordsUnlessAsked) {
    const CredentialList list{userCredential(1, "n")};
    const auto contains = [](const std::string& text) { return text.find("pässword") != std::string::npos; };
    EXPECT_FALSE(contains(credentialTable(list, Passwords::Hidden)[1]));
    EXPECT_TRUE(contains(credentialTable(list, Passwords::Shown)[1]));
    EXPECT_FALSE(contains(jsonLine(credentialsJson(list, Passwords::Hidden))));
    EXPECT_TRUE(contains(jsonLine(credentialsJson(list, Passwords::Shown))));
}

TEST(CredentialText, KindsThatAreNotKnownHaveANumber) {
    Credential credential = userCredential(1, "n");
    credential.type = 2;
    credential.access = 9;
    const Json::Value object = credentialJson(credential, 4, Passwords::Hidden);
    EXPECT_EQ(object["method"].asString(), "type 2");
    EXPECT_EQ(object["access"].asString(), "9");
    EXPECT_EQ(object["position"].asInt(), 4);
}

}  // namespace
}  // namespace vexa::client

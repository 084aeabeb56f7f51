#include <gtest/gtest.h>

#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

const std::string kChangesSaved = "Reading config detected config changes, and saving config succeeded.";
const std::string kReloaded = "Reload data succeeded.";
const std::string kNotSaved = "ERROR: Saving the configuration file failed.";

/// The first credential of the list, as the file holds it.
Json::Value stored(Story& story) {
    story.order("READ_CREDENTIAL_FROM_FILE");
    story.order("GET_ALL_CREDENTIAL_LIST");
    return story.hotspot().events().back().data[0];
}

void expectList(Story& story, const std::string& command, const std::string& data, const char* wanted) {
    story.expect("list behind " + command, list(story, command, data), wanted);
}

void remove(Story& story, const Json::Value& credential) {
    list(story, "DELETE_CREDENTIAL", R"({"Id":)" + credential["Id"].asString() + "}");
}

STORY(Credentials, AreStoredMovedEditedAndDeletedByTheClient, "{}") {
    story.expect("list", list(story), "null\n");
    expectList(story, "ADD_CREDENTIAL", ttlsData("a.example"), "1 a.example");
    expectList(story, "ADD_CREDENTIAL", tlsData("b.example"), "2 b.example, 1 a.example");
    expectList(story, "SET_POSITION_CREDENTIAL", R"({"Id":1,"Order":0})", "1 a.example, 2 b.example");
    expectList(story, "EDIT_CREDENTIAL", ttlsData("c.example", R"("Id":1,"CredentialName":"n")"),
               "1 n, 2 b.example");
    expectList(story, "DELETE_CREDENTIAL", R"({"Id":2})", "1 n");
}

STORY(Credentials, AreToldWithEveryMember, "{}") {
    list(story, "ADD_CREDENTIAL", tlsData("b.example"));
    story.order("ADD_CREDENTIAL",
                R"({"CredentialEapMethod":2,"Type":1,"AccessType":2,"CredentialName":"n","RealName":"r",)"
                R"("Creator":"someone","IsPrefered":true,"AutoConnect":true,"Username":"u",)"
                R"("Password":"p","CaCert":"not read","ClientCert":"not read"})");
    story.expect(
        "list", compact(story.hotspot().events().at(0).data),
        R"([{"AccessType":2,"AutoConnect":true,"CaCert":"","ClientCert":"","Creator":"someone",)"
        R"("CredentialEapMethod":2,"CredentialName":"n","Id":2,"Password":"p","RealName":"r","Type":1,)"
        R"("Username":"u"},)"
        R"({"AccessType":1,"AutoConnect":false,"CaCert":"ca","ClientCert":"client",)"
        R"("Creator":"KORVANE-PC\\user","CredentialEapMethod":1,"CredentialName":"b.example","Id":1,)"
        R"("Password":"","RealName":"b.example","Type":3,"Username":""}])");
}

// Each command is refused or changes nothing; the list comes in every case.
STORY(Credentials, ACommandThatCannotBeCarriedOutChangesNothingAndStillTellsTheList, "{}") {
    std::vector<std::string> additions = {"", "[]", "\"text\"", "{", "{}", tlsData("x", R"("CaCert":["c"])")};
    for (const char* const members :
         {R"("CredentialEapMethod":"2")", R"("Type":"1")", R"("Type":1.5)", R"("Type":4294967297)",
          R"("Type":true)", R"("Type":2)", R"("AccessType":3)", R"("AccessType":-1)", R"("RealName":7)",
          R"("RealName":"x\uffff")", R"("Username":["u"])", R"("Password":"a\u0001b")",
          R"("AutoConnect":"true")", R"("IsPrefered":1)", R"("RealName":"a.example","CredentialName":"x")",
          R"("CredentialName":"a.example")"})
        additions.push_back(ttlsData("x", members));
    const std::string edited = R"("CredentialEapMethod":2,"RealName":"x","Username":"u","Password":"p"})";

    list(story, "ADD_CREDENTIAL", ttlsData("a.example"));
    list(story, "ADD_CREDENTIAL", ttlsData("b.example"));
    const std::string file = story.config();
    const auto expectNothing = [&](const std::string& command, const std::vector<std::string>& inputs) {
        for (const std::string& data : inputs) {
            story.about(command + " " + data);
            story.forget();
            story.expect("list", list(story, command, data), "2 b.example, 1 a.example");
            const int refusals =
                count(story.messages(), "ERROR: ") + count(story.messages(), "Unknown credential");
            if (command == "ADD_CREDENTIAL") story.expectOfLog("refusals", refusals, 1);
            story.expect("file", story.config(), file);
        }
    };
    expectNothing("ADD_CREDENTIAL", additions);
    expectNothing("EDIT_CREDENTIAL",
                  {"{" + edited, R"({"Id":0,)" + edited, R"({"Id":"1",)" + edited, R"({"Id":9,)" + edited,
                   R"({"Id":1,"CredentialEapMethod":2,"RealName":"x","Username":"u"})",
                   R"({"Id":1,"CredentialEapMethod":1,"RealName":"x","Username":"u","Password":"p"})",
                   R"({"Id":1,"CredentialEapMethod":2,"Username":"u","Password":"p"})"});
    expectNothing("DELETE_CREDENTIAL", {"", R"({"Id":0})", R"({"Id":-1})", R"({"Id":9})", R"({"Id":"1"})",
                                        R"({"Id":1.5})", R"({"Id":1)", "1"});
    expectNothing("SET_POSITION_CREDENTIAL",
                  {R"({"Id":1,"Order":-1})", R"({"Id":1,"Order":9999})", R"({"Id":1,"Order":2147483647})",
                   R"({"Id":1,"Order":-2147483648})", R"({"Id":0,"Order":0})", R"({"Id":9,"Order":0})",
                   R"({"Id":1,"Order":"0"})", R"({"Id":1,"Order":0)"});
}

// Data comes as text. A client that sends it otherwise learns so by the list, and the log has one line of it.
STORY(Credentials, DataThatIsNoTextIsTheSame, "{}") {
    list(story, "ADD_CREDENTIAL", ttlsData("a.example"));
    for (const std::string command : {"GET_ALL_CREDENTIAL_LIST", "ADD_CREDENTIAL", "EDIT_CREDENTIAL",
                                      "DELETE_CREDENTIAL", "SET_POSITION_CREDENTIAL"})
        for (const std::string data : {R"({"Id":1,"Order":0})", "7", "[]", "1.5"}) {
            story.forget();
            story.about(command + " " + data);
            story.hotspot().sendRaw(R"({"CommandId":")" + command + R"(","Data":)" + data + "}");
            story.advance(0ms);
            story.expect("heard", heard(story), "GET_ALL_CREDENTIAL_LIST");
            story.expectOfLog("errors", count(story.messages(), "ERROR: "), 1);
            story.expect("list", list(story), "1 a.example");
        }
}

// A member that isn't there, is null or, for one of them, an empty container.
STORY(Credentials, MissingMembersAreEmpty, "{}") {
    const char* const inputs[] = {
        R"({"CredentialEapMethod":1,"Type":3,"RealName":"r"})",
        R"({"CredentialEapMethod":1,"Type":3,"RealName":"r","CaCert":null,"ClientCert":null,"Creator":null})",
        R"({"CredentialEapMethod":1,"Type":3,"RealName":"r","CaCert":[],"CredentialName":""})",
        R"({"CredentialEapMethod":1,"Type":3,"RealName":"r","CaCert":{},"AccessType":0})",
        R"({"CredentialEapMethod":5,"Type":3,"RealName":"r","CaCert":7,"Username":8})",
    };
    for (const char* const input : inputs) {
        list(story, "ADD_CREDENTIAL", input);
        const std::string file = story.config();
        const std::string wanted =
            "</id><type>eaptls</type><accesstype>alluser</accesstype><creator>KORVANE-PC\\user</creator>"
            "<eap>1</eap><autoconnect>false</autoconnect><credname>r</credname><realm>r</realm>"
            "<cacert></cacert><clientcert></clientcert></credential>";
        story.expect(input, file.substr(file.find("</id>"), wanted.size()), wanted);
        remove(story, stored(story));
    }
}

// Limits count UTF-16 units; a character of two units is kept whole or not at all.
STORY(Credentials, TextIsCutAtItsLimit, "{}") {
    const std::string smile = "\xF0\x9F\x98\x80";
    const std::string accent = "\xC3\xA9";

    const auto expectCut = [&](const std::string& member, const std::string& text,
                               const std::string& wanted) {
        list(story, "ADD_CREDENTIAL", ttlsData("realm", "\"" + member + "\":\"" + text + "\""));
        const Json::Value credential = stored(story);
        story.expect(member, credential[member].asString(), wanted);
        remove(story, credential);
    };
    for (const auto& [member, limit] :
         {std::pair("CredentialName", 127U), {"RealName", 127U}, {"Username", 63U}, {"Password", 63U}}) {
        expectCut(member, repeat("x", limit), repeat("x", limit));
        expectCut(member, repeat("x", limit + 1), repeat("x", limit));
        expectCut(member, repeat(smile, limit), repeat(smile, limit / 2));
        expectCut(member, "x" + repeat(smile, limit), "x" + repeat(smile, (limit - 1) / 2));
        expectCut(member, repeat(accent, limit + 5), repeat(accent, limit));
    }
    expectCut("Creator", repeat("x", 64), "KORVANE-PC\\user");
}

STORY(Credentials, AnyTextComesBackFromTheFile, "{}") {
    const std::string texts[] = {" leading and trailing ",   R"(<&>\"')",    "]]>",    R"(\t\n\r\r\n)",
                                 "\xF0\x9F\x98\x80\xC3\xA9", "\xEF\xBF\xBD", "a&#13;b"};

    for (const std::string& text : texts) {
        const std::string data =
            ttlsData("realm " + text, R"("Username":")" + text + R"(","Password":")" + text + "\"");
        list(story, "ADD_CREDENTIAL", data);
        const Json::Value credential = stored(story);
        for (const char* member : {"RealName", "Username", "Password"})
            story.expect(member, credential[member].asString(), parsed(data)[member].asString());
    }
}

STORY(Credentials, NeedAnAdapter, R"({"adapters":[{"inserted":false}]})") {
    const std::string file = story.config();
    for (const char* command : {"GET_ALL_CREDENTIAL_LIST", "ADD_CREDENTIAL", "EDIT_CREDENTIAL",
                                "DELETE_CREDENTIAL", "SET_POSITION_CREDENTIAL", "READ_CREDENTIAL_FROM_FILE"})
        story.order(command, ttlsData("a.example"));
    story.expect("heard", heard(story), "");
    story.expect("file", story.config(), file);
}

STORY(Credentials, AReloadTakesWhatOthersWroteAndAnswersNothing, "{}") {
    list(story, "ADD_CREDENTIAL", ttlsData("a.example"));
    std::string file = story.config();
    file.insert(file.find("</credentials><users>"),
                "<credential><id>7</id><type>eaptls</type><accesstype>alluser</accesstype>"
                "<realm>b.example</realm></credential>");
    story.writeConfig(file);
    for (const int saves : {1, 0}) {
        story.forget();
        story.order("READ_CREDENTIAL_FROM_FILE");
        story.expect("heard", heard(story), "");
        story.expectOfLog("reloads", count(story.messages(), kReloaded), 1);
        story.expectOfLog("saves", count(story.messages(), kChangesSaved), saves);
        story.expect("list", list(story), "7 b.example, 1 a.example");
    }
    story.writeConfig("<half");
    story.order("READ_CREDENTIAL_FROM_FILE");
    expectList(story, "ADD_CREDENTIAL", ttlsData("c.example"), "8 c.example, 7 b.example, 1 a.example");
    story.expect("file", story.config(), "<half");
    story.expectOfLog("failures", count(story.messages(), kNotSaved), 1);
}

STORY(Credentials, AFullDiskIsToldInOneLineAndTheNextSaveHeals, "{}") {
    list(story, "ADD_CREDENTIAL", ttlsData("a.example"));
    const std::string file = story.config();
    story.perform(failing("write", 112, R"("match":"config.xml")"));
    expectList(story, "ADD_CREDENTIAL", ttlsData("b.example"), "2 b.example, 1 a.example");
    story.expect("file", story.config(), file);
    story.expectOfLog("failures", count(story.messages(), kNotSaved), 1);
    expectList(story, "ADD_CREDENTIAL", ttlsData("c.example"), "3 c.example, 2 b.example, 1 a.example");
    story.expect("next id", count(story.config(), "<nextcredid>4</nextcredid>"), 1);
    story.expect("realms", count(story.config(), "<realm>"), 3);
    story.expectOfLog("failures", count(story.messages(), kNotSaved), 1);
}

}  // namespace
}  // namespace vexa::test

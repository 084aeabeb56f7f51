#include <gtest/gtest.h>

#include "engine/StoreStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

TEST(Credentials, AreStoredMovedEditedAndDeletedByTheClient) {
    const Ending ending = runStory(1, "{}", [](World& world) {
        std::string told = list(world, "GET_ALL_CREDENTIAL_LIST");
        told += list(world, "ADD_CREDENTIAL", ttlsData("a.example"));
        told += list(world, "ADD_CREDENTIAL", tlsData("b.example"));
        told += list(world, "SET_POSITION_CREDENTIAL", R"({"Id":1,"Order":0})");
        told +=
            list(world, "EDIT_CREDENTIAL",
                 R"({"Id":1,"CredentialEapMethod":2,"Type":1,"CredentialName":"n","RealName":"c.example",)"
                 R"("Username":"v","Password":"q","AutoConnect":true})");
        told += list(world, "DELETE_CREDENTIAL", R"({"Id":2})");
        return told;
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "null\n"
              "1 a.example\n"
              "2 b.example, 1 a.example\n"
              "1 a.example, 2 b.example\n"
              "1 n, 2 b.example\n"
              "1 n\n");
}

TEST(Credentials, AreToldWithEveryMember) {
    const Ending ending = runStory(1, "{}", [](World& world) {
        list(world, "ADD_CREDENTIAL", tlsData("b.example"));
        world.hotspot().send(
            "ADD_CREDENTIAL",
            R"({"CredentialEapMethod":2,"Type":1,"AccessType":2,"CredentialName":"n","RealName":"r",)"
            R"("Creator":"someone","IsPrefered":true,"AutoConnect":true,"Username":"u",)"
            R"("Password":"p","CaCert":"not read","ClientCert":"not read"})");
        world.advance(0ms);
        return world.hotspot().events().at(0).dataText;
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, R"([
   {
      "AccessType" : 2,
      "AutoConnect" : true,
      "CaCert" : "",
      "ClientCert" : "",
      "Creator" : "someone",
      "CredentialEapMethod" : 2,
      "CredentialName" : "n",
      "Id" : 2,
      "Password" : "p",
      "RealName" : "r",
      "Type" : 1,
      "Username" : "u"
   },
   {
      "AccessType" : 1,
      "AutoConnect" : false,
      "CaCert" : "ca",
      "ClientCert" : "client",
      "Creator" : "KORVANE-PC\\user",
      "CredentialEapMethod" : 1,
      "CredentialName" : "b.example",
      "Id" : 1,
      "Password" : "",
      "RealName" : "b.example",
      "Type" : 3,
      "Username" : ""
   }
]
)");
}

// Each command is refused or changes nothing; the list comes in every case.
TEST(Credentials, ACommandThatCannotBeCarriedOutChangesNothingAndStillTellsTheList) {
    struct Case {
        const char* command;
        const char* data;
    };
    const Case cases[] = {
        {"ADD_CREDENTIAL", ""},
        {"ADD_CREDENTIAL", "[]"},
        {"ADD_CREDENTIAL", "\"text\""},
        {"ADD_CREDENTIAL", "{"},
        {"ADD_CREDENTIAL", "{}"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":"2","Type":1,"RealName":"x"})"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":2,"Type":"1","RealName":"x"})"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":2,"Type":1.5,"RealName":"x"})"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":2,"Type":4294967297,"RealName":"x"})"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":2,"Type":true,"RealName":"x"})"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":2,"Type":1,"RealName":7})"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":2,"Type":1,"RealName":"x","Username":["u"]})"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":2,"Type":1,"RealName":"x","Password":"a\u0001b"})"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":2,"Type":1,"RealName":"x\uffff"})"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":2,"Type":1,"RealName":"x","AutoConnect":"true"})"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":2,"Type":1,"RealName":"x","IsPrefered":1})"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":1,"Type":3,"RealName":"x","CaCert":["c"]})"},
        {"ADD_CREDENTIAL", R"({"CredentialEapMethod":2,"Type":2,"RealName":"x"})"},
        {"ADD_CREDENTIAL",
         R"({"CredentialEapMethod":2,"Type":1,"RealName":"a.example","CredentialName":"x"})"},
        {"ADD_CREDENTIAL",
         R"({"CredentialEapMethod":2,"Type":1,"RealName":"x","CredentialName":"a.example"})"},
        {"EDIT_CREDENTIAL", R"({"CredentialEapMethod":2,"RealName":"x","Username":"u","Password":"p"})"},
        {"EDIT_CREDENTIAL",
         R"({"Id":0,"CredentialEapMethod":2,"RealName":"x","Username":"u","Password":"p"})"},
        {"EDIT_CREDENTIAL",
         R"({"Id":"1","CredentialEapMethod":2,"RealName":"x","Username":"u","Password":"p"})"},
        {"EDIT_CREDENTIAL",
         R"({"Id":9,"CredentialEapMethod":2,"RealName":"x","Username":"u","Password":"p"})"},
        {"EDIT_CREDENTIAL", R"({"Id":1,"CredentialEapMethod":2,"RealName":"x","Username":"u"})"},
        {"EDIT_CREDENTIAL",
         R"({"Id":1,"CredentialEapMethod":1,"RealName":"x","Username":"u","Password":"p"})"},
        {"EDIT_CREDENTIAL", R"({"Id":1,"CredentialEapMethod":2,"Username":"u","Password":"p"})"},
        {"DELETE_CREDENTIAL", ""},
        {"DELETE_CREDENTIAL", R"({"Id":0})"},
        {"DELETE_CREDENTIAL", R"({"Id":-1})"},
        {"DELETE_CREDENTIAL", R"({"Id":9})"},
        {"DELETE_CREDENTIAL", R"({"Id":"1"})"},
        {"DELETE_CREDENTIAL", R"({"Id":1.5})"},
        {"DELETE_CREDENTIAL", "1"},
        {"SET_POSITION_CREDENTIAL", R"({"Id":1,"Order":-1})"},
        {"SET_POSITION_CREDENTIAL", R"({"Id":1,"Order":9999})"},
        {"SET_POSITION_CREDENTIAL", R"({"Id":1,"Order":2147483647})"},
        {"SET_POSITION_CREDENTIAL", R"({"Id":1,"Order":-2147483648})"},
        {"SET_POSITION_CREDENTIAL", R"({"Id":0,"Order":0})"},
        {"SET_POSITION_CREDENTIAL", R"({"Id":9,"Order":0})"},
        {"SET_POSITION_CREDENTIAL", R"({"Id":1,"Order":"0"})"},
    };
    const Ending ending = runStory(1, "{}", [&](World& world) {
        list(world, "ADD_CREDENTIAL", ttlsData("a.example"));
        const std::string before = list(world, "ADD_CREDENTIAL", ttlsData("b.example"));
        const std::string file = world.config();
        std::string wrong;
        for (const Case& c : cases)
            if (list(world, c.command, c.data) != before || world.config() != file)
                wrong += std::string(c.command) + " " + c.data + "\n";
        return wrong;
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

// Data comes as text. A client that sends it otherwise learns so by the list, and the log has one line of it.
TEST(Credentials, DataThatIsNoTextIsTheSame) {
    for (const char* const command : {"GET_ALL_CREDENTIAL_LIST", "ADD_CREDENTIAL", "EDIT_CREDENTIAL",
                                      "DELETE_CREDENTIAL", "SET_POSITION_CREDENTIAL"}) {
        const Ending ending = runStory(1, "{}", [&](World& world) {
            const std::string before = list(world, "ADD_CREDENTIAL", ttlsData("a.example"));
            std::string told;
            for (const std::string data : {R"({"Id":1,"Order":0})", "7", "[]", "1.5"}) {
                world.hotspot().sendRaw(std::string(R"({"CommandId":")") + command + R"(","Data":)" + data +
                                        "}");
                world.advance(0ms);
                const auto events = world.hotspot().events();
                told +=
                    events.size() == 1 && events[0].id == "GET_ALL_CREDENTIAL_LIST" ? "list " : "no list ";
            }
            told += list(world, "GET_ALL_CREDENTIAL_LIST") == before ? "" : "changed ";
            return told + count(world.log(), "ERROR: ");
        });
        EXPECT_TRUE(ending.isOrderly) << ending.errors;
        EXPECT_EQ(ending.text, "list list list list 4 ") << command;
    }
}

// A member that isn't there, is null or, for one of them, an empty container.
TEST(Credentials, MissingMembersAreEmpty) {
    const char* const inputs[] = {
        R"({"CredentialEapMethod":1,"Type":3,"RealName":"r"})",
        R"({"CredentialEapMethod":1,"Type":3,"RealName":"r","CaCert":null,"ClientCert":null,"Creator":null})",
        R"({"CredentialEapMethod":1,"Type":3,"RealName":"r","CaCert":[],"CredentialName":""})",
        R"({"CredentialEapMethod":1,"Type":3,"RealName":"r","CaCert":{},"AccessType":0})",
        R"({"CredentialEapMethod":5,"Type":3,"RealName":"r","CaCert":7,"Username":8})",
    };
    for (const char* const input : inputs) {
        const Ending ending = runStory(1, "{}", [&](World& world) {
            list(world, "ADD_CREDENTIAL", input);
            const std::string file = world.config();
            return file.substr(file.find("<credential>"),
                               file.find("</credential>") - file.find("<credential>"));
        });
        EXPECT_TRUE(ending.isOrderly) << ending.errors;
        EXPECT_EQ(ending.text,
                  "<credential><id>1</id><type>eaptls</type><accesstype>alluser</accesstype>"
                  "<creator>KORVANE-PC\\user</creator><eap>1</eap><autoconnect>false</autoconnect>"
                  "<credname>r</credname><realm>r</realm><cacert></cacert><clientcert></clientcert>")
            << input;
    }
}

// Limits count UTF-16 units; a character of two units is kept whole or not at all.
TEST(Credentials, TextIsCutAtItsLimit) {
    struct Case {
        const char* member;
        std::size_t limit;
    };
    const std::string smile = "\xF0\x9F\x98\x80";
    const auto repeat = [](const std::string& text, std::size_t times) {
        std::string all;
        for (std::size_t i = 0; i < times; ++i)
            all += text;
        return all;
    };
    for (const Case& c : {Case{"CredentialName", 127}, Case{"RealName", 127}, Case{"Username", 63},
                          Case{"Password", 63}, Case{"Creator", 63}}) {
        const std::string inputs[] = {repeat("x", c.limit), repeat("x", c.limit + 1), repeat(smile, c.limit),
                                      "x" + repeat(smile, c.limit), repeat("\xC3\xA9", c.limit + 5)};
        const std::string expected[] = {repeat("x", c.limit), repeat("x", c.limit),
                                        repeat(smile, c.limit / 2), "x" + repeat(smile, (c.limit - 1) / 2),
                                        repeat("\xC3\xA9", c.limit)};
        for (std::size_t i = 0; i < std::size(inputs); ++i) {
            const Ending ending = runStory(1, "{}", [&](World& world) {
                Json::Value data = parsed(ttlsData("realm"));
                data[c.member] = inputs[i];
                list(world, "ADD_CREDENTIAL", data.toStyledString());
                world.hotspot().send("READ_CREDENTIAL_FROM_FILE");
                world.hotspot().send("GET_ALL_CREDENTIAL_LIST");
                world.advance(0ms);
                const auto events = world.hotspot().events();
                return events.back().data[0][c.member].asString();
            });
            EXPECT_TRUE(ending.isOrderly) << ending.errors;
            const bool isCreator = std::string(c.member) == "Creator";
            EXPECT_EQ(ending.text, isCreator ? "KORVANE-PC\\user" : expected[i]) << c.member << i;
        }
    }
}

TEST(Credentials, AnyTextComesBackFromTheFile) {
    const char* const texts[] = {" leading and trailing ",   "<&>\"'",       "]]>",    "\t\n\r\r\n",
                                 "\xF0\x9F\x98\x80\xC3\xA9", "\xEF\xBF\xBD", "a&#13;b"};
    const Ending ending = runStory(1, "{}", [&](World& world) {
        std::string wrong;
        for (const char* const text : texts) {
            Json::Value data = parsed(ttlsData(std::string("realm ") + text));
            data["Username"] = data["Password"] = text;
            list(world, "ADD_CREDENTIAL", data.toStyledString());
            world.hotspot().send("READ_CREDENTIAL_FROM_FILE");
            world.hotspot().send("GET_ALL_CREDENTIAL_LIST");
            world.advance(0ms);
            const Json::Value stored = world.hotspot().events().back().data[0];
            for (const char* member : {"RealName", "Username", "Password"})
                if (stored[member] != data[member]) wrong += stored[member].toStyledString();
        }
        return wrong;
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

TEST(Credentials, NeedAnAdapter) {
    const Ending ending = runStory(1, R"({"adapters":[{"inserted":false}]})", [](World& world) {
        const std::string file = world.config();
        for (const char* command :
             {"GET_ALL_CREDENTIAL_LIST", "ADD_CREDENTIAL", "EDIT_CREDENTIAL", "DELETE_CREDENTIAL",
              "SET_POSITION_CREDENTIAL", "READ_CREDENTIAL_FROM_FILE"})
            world.hotspot().send(command, ttlsData("a.example"));
        world.advance(0ms);
        const std::string told = world.hotspot().ids();
        return told + (world.config() == file ? "" : " and the file changed");
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "");
}

TEST(Credentials, AReloadTakesWhatOthersWroteAndAnswersNothing) {
    const Ending ending = runStory(1, "{}", [](World& world) {
        list(world, "ADD_CREDENTIAL", ttlsData("a.example"));
        std::string file = world.config();
        file.insert(file.find("</credentials><users>"),
                    "<credential><id>7</id><type>eaptls</type><accesstype>alluser</accesstype>"
                    "<realm>b.example</realm></credential>");
        writeConfig(world, file);
        world.hotspot().send("READ_CREDENTIAL_FROM_FILE");
        world.advance(0ms);
        std::string told = world.hotspot().ids() + "|" + list(world, "GET_ALL_CREDENTIAL_LIST");
        told += count(world.log(), "Reading config detected config changes, and saving config succeeded.");
        told += count(world.log(), "Reload data succeeded.");
        world.hotspot().send("READ_CREDENTIAL_FROM_FILE");
        world.advance(0ms);
        told += count(world.log(), "Reading config detected config changes, and saving config succeeded.");
        told += count(world.log(), "Reload data succeeded.");
        writeConfig(world, "<half");
        world.hotspot().send("READ_CREDENTIAL_FROM_FILE");
        told += list(world, "ADD_CREDENTIAL", ttlsData("c.example"));
        told += world.config() + count(world.log(), "ERROR: Saving the configuration file failed.");
        return told;
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text,
              "|7 b.example, 1 a.example\n"
              "1 1 1 2 "
              "2 c.example, 7 b.example, 1 a.example\n"
              "<half1 ");
}

TEST(Credentials, AFullDiskIsToldInOneLineAndTheNextSaveHeals) {
    const Ending ending = runStory(1, "{}", [](World& world) {
        list(world, "ADD_CREDENTIAL", ttlsData("a.example"));
        const std::string file = world.config();
        world.perform(R"({"do":"fail","call":"write","error":112,"times":3,"match":"config.xml"})");
        std::string told = list(world, "ADD_CREDENTIAL", ttlsData("b.example"));
        told += world.config() == file ? "whole " : "harmed ";
        told += count(world.log(), "ERROR: Saving the configuration file failed.");
        told += list(world, "ADD_CREDENTIAL", ttlsData("c.example"));
        told += count(world.config(), "<nextcredid>4</nextcredid>") + count(world.config(), "<realm>");
        return told + count(world.log(), "ERROR: Saving the configuration file failed.");
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "2 b.example, 1 a.example\nwhole 1 3 c.example, 2 b.example, 1 a.example\n1 3 1 ");
}

}  // namespace
}  // namespace vexa::test

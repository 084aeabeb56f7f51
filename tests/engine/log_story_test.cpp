#include <gtest/gtest.h>

#include <regex>

#include "base/DiagnosticLog.h"
#include "engine/StoreStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

std::string logFile(World& world) {
    const auto path = world.store() / "Dump" / "hs20log.txt_user.txt";
    return std::filesystem::exists(path) ? "file" : "no file";
}

// What the log holds behind what the service itself wrote at its start.
std::string written(World& world, const std::function<void()>& calls) {
    const std::size_t before = world.logSize();
    calls();
    return world.log().substr(before);
}

// Each number, whatever it is, as "#".
std::string withoutNumbers(const std::string& text) {
    return std::regex_replace(text, std::regex("\\[[0-9]+\\]"), "[#]");
}

std::string story(const std::function<void()>& calls) {
    const Ending ending =
        runStory(1, "{}", [&](World& world) { return withoutNumbers(written(world, calls)); });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    return ending.text;
}

TEST(Log, ALineHasANumberATimeAndTwoBlanks) {
    EXPECT_EQ(story([] {
                  Log(3, "Radio state changed from %s == > %s", "On", "Off");
                  LogWide(6, L"wide %d %s %ls %%s%c", 7, L"text", L"more", L'!');
              }),
              "[#] 01/05 08:00:00  Radio state changed from On == > Off\n"
              "[#] 01/05 08:00:00  wide 7 text more %s!\n");
}

TEST(Log, LevelsBelowTwoAreNeverWritten) {
    EXPECT_EQ(
        story([] {
            for (int level = -1; level <= 7; ++level) {
                Log(level, "narrow %d", level);
                LogWide(level, L"wide %d", level);
                LogBytes(level, "bytes ", "x", 1, true);
            }
        }),
        [] {
            std::string text;
            for (int level = 2; level <= 7; ++level)
                for (const std::string& line : {"narrow " + std::to_string(level),
                                                "wide " + std::to_string(level), std::string("bytes x")})
                    text += "[#] 01/05 08:00:00  " + line + "\n";
            return text;
        }());
}

TEST(Log, HexGoesBehindItsTitleAndTheNextLineBehindTheHex) {
    const unsigned char bytes[] = {0x00, 0x0F, 0xA0, 0xFF};
    EXPECT_EQ(story([&] {
                  LogHex(0, "title:", bytes, 4);
                  LogHex(3, nullptr, bytes, 4);
                  LogHex(3, "none", nullptr, 4);
                  LogHex(3, "none", bytes, 0);
                  Log(3, "next");
              }),
              "[#] title: 00 0f a0 ff[#] 01/05 08:00:00  next\n");
}

TEST(Log, BytesAreShownAsCharacters) {
    EXPECT_EQ(story([] {
                  LogBytes(3, "ssid ", "a b\n\x7F\x80~", 7, false);
                  LogBytes(3, "next ", "c", 1, true);
                  LogBytes(3, "none", "c", 0, true);
                  LogBytes(3, "none", "c", -1, true);
                  LogBytes(3, "none", nullptr, 1, true);
                  LogBytes(3, nullptr, "c", 1, true);
                  LogBytes(1, "none", "c", 1, true);
              }),
              "[#] 01/05 08:00:00  ssid a b___~[#] 01/05 08:00:00  next c\n");
}

TEST(Log, AWideLineEndsBeforeTheFirstCharacterThatHasNoByte) {
    EXPECT_EQ(story([] {
                  LogWide(3, L"caf\u00E9 %s", L"\u4E2D");
                  LogWide(3, L"%s", L"\U0001F600");
              }),
              "[#] 01/05 08:00:00  caf\xE9 \n[#] 01/05 08:00:00  \n");
}

// Number and text together fill the buffer but for its terminator.
TEST(Log, WhatDoesNotFitIsCut) {
    const std::string longText(30000, 'x');
    const std::size_t time = std::string("01/05 08:00:00  ").size();
    EXPECT_EQ(story([&] { Log(3, "%s", longText.c_str()); }),
              "[#] 01/05 08:00:00  " + std::string(20479 - time - 1, 'x') + "\n");
    EXPECT_EQ(story([&] { LogWide(3, L"%s", std::wstring(30000, L'x').c_str()); }),
              "[#] 01/05 08:00:00  " + std::string(20479 - time - 1, 'x') + "\n");
    EXPECT_EQ(story([&] { LogBytes(3, "t", longText.data(), 30000, false); }),
              "[#] 01/05 08:00:00  t" + std::string(20479 - time - 1, 'x'));
    const std::string hex = story([&] { LogHex(3, "t", longText.data(), 30000); });
    EXPECT_EQ(hex.size(), std::string("[#] t").size() + 6826 * 3);
}

constexpr const char* kSilent =
    R"({"config":"<c><global><enabledump>false</enabledump><nextcredid>1</nextcredid></global>
<credentials/><users/></c>"})";

std::string withFlag(World& world, const std::string& flag) {
    const std::string file = world.config();
    const std::size_t from = file.find("<enabledump>") + 12;
    return file.substr(0, from) + flag + file.substr(file.find("</enabledump>"));
}

void reloadWith(World& world, const std::string& flag) {
    writeConfig(world, withFlag(world, flag));
    world.hotspot().send("READ_CREDENTIAL_FROM_FILE");
    world.advance(0ms);
}

TEST(Log, SwitchedOffMakesNoFileAndCannotBeSwitchedOnWhileTheServiceRuns) {
    const Ending ending = runStory(1, kSilent, [](World& world) {
        Log(6, "unheard");
        world.advance(15s);
        std::string told = logFile(world) + ", ";
        reloadWith(world, "true");
        Log(6, "still unheard");
        world.advance(15s);
        return told + logFile(world);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "no file, no file");
}

TEST(Log, AReloadSilencesItAndResumesIt) {
    const Ending ending = runStory(1, "{}", [](World& world) {
        Log(3, "first");
        reloadWith(world, "false");
        Log(3, "second");
        world.advance(11s);
        reloadWith(world, "true");
        Log(3, "third");
        const std::string log = world.log();
        return count(log, "first") + count(log, "second") + count(log, "third");
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "1 0 1 ");
}

TEST(Log, TheThreadWritesEveryTenSeconds) {
    const Ending ending = runStory(1, "{}", [](World& world) {
        std::string told = logFile(world);
        world.advance(9s);
        told += ", " + logFile(world);
        world.advance(2s);
        return told + ", " + logFile(world);
    });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    EXPECT_EQ(ending.text, "no file, no file, file");
}

TEST(Log, TellsAStartLineByLine) {
    const Ending ending = runStory(1, "{}", [](World& world) { return world.log(); });
    EXPECT_TRUE(ending.isOrderly) << ending.errors;
    const char* const lines[] = {"SupplicantMgr initiailization succeeded.",
                                 "Enter addSupplicantIfInterfaceExists...",
                                 "Start to add a HS20 supplicant.",
                                 "Initializing supplicant...",
                                 "Interface GUID: {6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001}",
                                 "!!!Query interface mac address succeeded, mac address 02:1f:5d:00:00:01",
                                 "Radio state changed from Off == > On",
                                 "Supplicant state changed from InvalidState to Initialized",
                                 "Supplicant State=Initialized",
                                 "Initialize supplicant succeeded."};
    std::size_t at = 0;
    for (const char* const line : lines) {
        at = ending.text.find(line, at);
        ASSERT_NE(at, std::string::npos) << line << " is missing, or out of order, in\n" << ending.text;
    }
}

}  // namespace
}  // namespace vexa::test

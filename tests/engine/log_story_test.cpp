#include <gtest/gtest.h>

#include <regex>

#include "base/DiagnosticLog.h"
#include "engine/world/ConnectStory.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

const std::string kTime = "[#] 01/05 08:00:00  ";

/// What the log holds of these calls, each line's number as "#".
void expectWritten(Story& story, const char* what, const std::string& wanted,
                   const std::function<void()>& calls) {
    const std::size_t before = story.log().size();
    calls();
    const std::string written = story.log().substr(before);
    story.expect(what, std::regex_replace(written, std::regex("\\[[0-9]+\\]"), "[#]"), wanted);
}

STORY(Log, WritesWhatItIsGiven, {.log = true}, "{}") {
    expectWritten(story, "a line has a number, a time and two blanks",
                  kTime + "Radio state changed from On == > Off\n" + kTime + "wide 7 text more %s!\n", [] {
                      Log(3, "Radio state changed from %s == > %s", "On", "Off");
                      LogWide(6, L"wide %d %s %ls %%s%c", 7, L"text", L"more", L'!');
                  });
    std::string fromTwoOn;
    for (int level = 2; level <= 7; ++level)
        for (const std::string& line :
             {"narrow " + std::to_string(level), "wide " + std::to_string(level), std::string("bytes x")})
            fromTwoOn += kTime + line + "\n";
    expectWritten(story, "levels below two are never written", fromTwoOn, [] {
        for (int level = -1; level <= 7; ++level) {
            Log(level, "narrow %d", level);
            LogWide(level, L"wide %d", level);
            LogBytes(level, "bytes ", "x", 1, true);
        }
    });
    expectWritten(story, "hex goes behind its title and the next line behind the hex",
                  "[#] title: 00 0f a0 ff" + kTime + "next\n", [] {
                      const unsigned char bytes[] = {0x00, 0x0F, 0xA0, 0xFF};
                      LogHex(0, "title:", bytes, 4);
                      LogHex(3, nullptr, bytes, 4);
                      LogHex(3, "none", nullptr, 4);
                      LogHex(3, "none", bytes, 0);
                      Log(3, "next");
                  });
    expectWritten(story, "bytes are shown as characters", kTime + "ssid a b___~" + kTime + "next c\n", [] {
        LogBytes(3, "ssid ", "a b\n\x7F\x80~", 7, false);
        LogBytes(3, "next ", "c", 1, true);
        LogBytes(3, "none", "c", 0, true);
        LogBytes(3, "none", "c", -1, true);
        LogBytes(3, "none", nullptr, 1, true);
        LogBytes(3, nullptr, "c", 1, true);
        LogBytes(1, "none", "c", 1, true);
    });
    expectWritten(story, "a wide line ends before the first character that has no byte",
                  kTime + "caf\xE9 \n" + kTime + "\n", [] {
                      LogWide(3, L"caf\u00E9 %s", L"\u4E2D");
                      LogWide(3, L"%s", L"\U0001F600");
                  });
}

// Time and text together fill the buffer but for its terminator.
STORY(Log, CutsWhatDoesNotFit, {.log = true}, "{}") {
    const std::string longText(30000, 'x');
    const std::string cut(20479 - std::string("01/05 08:00:00  ").size() - 1, 'x');
    std::string hex;
    while (hex.size() < 6826 * 3)
        hex += " 78";
    expectWritten(story, "narrow", kTime + cut + "\n", [&] { Log(3, "%s", longText.c_str()); });
    expectWritten(story, "wide", kTime + cut + "\n",
                  [&] { LogWide(3, L"%s", std::wstring(30000, L'x').c_str()); });
    expectWritten(story, "bytes", kTime + "t" + cut,
                  [&] { LogBytes(3, "t", longText.data(), 30000, false); });
    expectWritten(story, "hex", "[#] t" + hex, [&] { LogHex(3, "t", longText.data(), 30000); });
}

void reloadWith(Story& story, const std::string& flag) {
    const std::regex element("<enabledump>[a-z]*");
    story.writeConfig(std::regex_replace(story.config(), element, "<enabledump>" + flag));
    story.order("READ_CREDENTIAL_FROM_FILE");
}

STORY(Log, SwitchedOffMakesNoFileAndCannotBeSwitchedOnWhileTheServiceRuns, {.log = false}, "{}") {
    for (const char* const line : {"unheard", "still unheard"}) {
        Log(6, "%s", line);
        story.advance(15s);
        story.expect(line, std::filesystem::exists(story.logFile()), false);
        reloadWith(story, "true");
    }
}

STORY(Log, AReloadSilencesItAndResumesIt, {.log = true}, "{}") {
    Log(3, "first");
    reloadWith(story, "false");
    Log(3, "second");
    story.advance(11s);
    reloadWith(story, "true");
    Log(3, "third");
    for (const auto& [line, times] : {std::pair("first", 1), {"second", 0}, {"third", 1}})
        story.expect(line, count(story.log(), line), times);
}

STORY(Log, TellsAStartLineByLineInItsFileBehindTenSeconds, {.log = true}, "{}") {
    story.advance(9s);
    story.expect("file", std::filesystem::exists(story.logFile()), false);
    story.advance(2s);
    story.expect("file", std::filesystem::exists(story.logFile()), true);
    story.expectLog("SupplicantMgr initiailization succeeded.", "Enter addSupplicantIfInterfaceExists...",
                    "Start to add a HS20 supplicant.", "Initializing supplicant...",
                    "Interface GUID: {6B1E8A4C-5D2F-4E0B-9C37-1F5D00000001}",
                    "!!!Query interface mac address succeeded, mac address 02:1f:5d:00:00:01",
                    "Radio state changed from Off == > On",
                    "Supplicant state changed from InvalidState to Initialized",
                    "Supplicant State=Initialized", "Initialize supplicant succeeded.");
}

}  // namespace
}  // namespace vexa::test

#include "simulation/windows/LoadedMachine.h"

#include <windows.h>
// After <windows.h>.
#include <shlobj.h>

#include <algorithm>
#include <charconv>
#include <cstdio>
#include <fstream>
#include <iterator>

#include "contract/Process.h"
#include "contract/Store.h"
#include "platform/windows/Handle.h"
#include "simulation/control/ControlServer.h"
#include "simulation/control/Timeline.h"
#include "simulation/scenario/DemoScenario.h"
#include "simulation/scenario/Reach.h"
#include "simulation/windows/SystemRegistry.h"
#include "text/TextConversion.h"

namespace vexa::simulation {

namespace {

namespace fs = std::filesystem;

constexpr UINT kBadSetup = 2;

// At once, in the middle of the loading of libraries too: nothing of the program has run yet, or nothing of
// it can go on.
[[noreturn]] void refuse(std::string line) {
    std::replace_if(
        line.begin(), line.end(), [](char c) { return c == '\n' || c == '\r'; }, ' ');
    line += '\n';
    DWORD written = 0;
    WriteFile(GetStdHandle(STD_ERROR_HANDLE), line.data(), static_cast<DWORD>(line.size()), &written,
              nullptr);
    TerminateProcess(GetCurrentProcess(), kBadSetup);
    std::terminate();
}

/// Empty if there is no such variable.
std::wstring environment(const wchar_t* name) {
    std::wstring value(GetEnvironmentVariableW(name, nullptr, 0), L'\0');
    value.resize(GetEnvironmentVariableW(name, value.data(), static_cast<DWORD>(value.size())));
    return value;
}

// The built-in scenario lives as fast as the clock lets it.
Scenario builtInScenario() {
    Scenario result = parseScenario(demoScenario());
    result.speed = 1.0;
    return result;
}

Scenario scenarioIn(const fs::path& path) {
    std::ifstream file(path, std::ios::binary);
    if (!file) throw JsonFault(utf8FromWide(path.wstring()) + ": can't be read");
    return parseScenario(std::string(std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()));
}

const Scenario& scenario() {
    static const Scenario read = [] {
        const fs::path path = environment(L"VEXA_SCENARIO");
        Scenario result = path.empty() ? builtInScenario() : scenarioIn(path);
        checkReach(result);
        return result;
    }();
    return read;
}

fs::path publicFolder() {
    platform::Owned<PWSTR, &CoTaskMemFree> path;
    if (SHGetKnownFolderPath(FOLDERID_Public, 0, nullptr, path.receive()) != S_OK)
        throw JsonFault("config: there is no public folder");
    return path.get();
}

void writeConfiguration(const std::string& text) {
    const fs::path folder = contract::storeFolder(publicFolder());
    std::error_code error;
    fs::create_directories(folder, error);
    std::ofstream file(folder / contract::kConfigFile, std::ios::binary | std::ios::trunc);
    file << text;
    if (!file.flush()) throw JsonFault("config: can't be written");
}

// The program that finds another one at work leaves at once: what that one uses is not its own.
bool isSecondInstance() {
    return static_cast<bool>(platform::Handle(OpenMutexA(SYNCHRONIZE, FALSE, contract::kInstanceMutex)));
}

std::int32_t controlPort(const std::wstring& text) {
    const std::string digits = utf8FromWide(text);
    std::int32_t port = 0;
    const auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), port);
    return error == std::errc() && end == digits.data() + digits.size() ? port : 0;
}

// Neither is ever destroyed: the threads of both end with the process.
Machine& makeMachine() {
    Machine& machine = *std::make_unique<Machine>(scenario(), fs::path()).release();
    beginTimeline(machine);
    const std::wstring port = environment(L"VEXA_CONTROL_PORT");
    if (port.empty()) return machine;
    auto server = startControlServer(machine, controlPort(port));
    if (!server) refuse("control channel: can't be opened on port " + utf8FromWide(port));
    static_cast<void>(std::make_unique<std::shared_ptr<IpcWebSocketServer>>(std::move(server)).release());
    return machine;
}

}  // namespace

Machine& loadedMachine() {
    static Machine& machine = makeMachine();
    return machine;
}

void prepareSystem() {
    try {
        const Scenario& wanted = scenario();
        if (isSecondInstance()) return;
        if (!writeClassKey(wanted.registryClass)) throw JsonFault("registryClass: can't be written");
        if (wanted.hotspotAutoConnect && !writeAutoConnect(wanted.hotspotAutoConnect))
            throw JsonFault("hotspotAutoConnect: can't be written");
        if (wanted.config) writeConfiguration(*wanted.config);
    } catch (const JsonFault& fault) {
        refuse(fault.what());
    }
}

}  // namespace vexa::simulation

#include <windows.h>

#include <filesystem>
#include <random>

#include "text/TextConversion.h"
#include "unit/platform/MachineWorld.h"

namespace vexa::test {

namespace {

constexpr DWORD kNarrowText = 0x40010006;
constexpr DWORD kWideText = 0x4001000A;

thread_local std::vector<std::string> g_heard;

// A text for the debugger is an exception that, if nobody is there to hear it, goes on.
LONG CALLBACK hear(PEXCEPTION_POINTERS pointers) {
    const EXCEPTION_RECORD& record = *pointers->ExceptionRecord;
    if (record.ExceptionCode == kNarrowText)
        g_heard.emplace_back(reinterpret_cast<const char*>(record.ExceptionInformation[1]));
    else if (record.ExceptionCode == kWideText)
        g_heard.push_back(utf8FromWide(reinterpret_cast<const wchar_t*>(record.ExceptionInformation[1])));
    else
        return EXCEPTION_CONTINUE_SEARCH;
    return EXCEPTION_CONTINUE_EXECUTION;
}

std::string withoutLineEnd(std::string line) {
    if (line.ends_with('\n')) line.pop_back();
    return line;
}

}  // namespace

struct MachineWorld::State {
    std::filesystem::path folder;
    PVOID handler;
};

MachineWorld::MachineWorld() : m_state(std::make_unique<State>()) {
    m_state->folder =
        std::filesystem::temp_directory_path() / ("vexa-contract-" + std::to_string(std::random_device()()));
    std::filesystem::create_directory(m_state->folder);
    g_heard.clear();
    m_state->handler = AddVectoredExceptionHandler(1, hear);
}

MachineWorld::~MachineWorld() {
    RemoveVectoredExceptionHandler(m_state->handler);
    std::error_code ignored;
    std::filesystem::remove_all(m_state->folder, ignored);
}

std::wstring MachineWorld::folder() const {
    return m_state->folder.wstring();
}

std::vector<std::string> MachineWorld::debugLines() {
    std::vector<std::string> lines;
    for (const std::string& text : g_heard)
        lines.push_back(withoutLineEnd(text));
    return lines;
}

}  // namespace vexa::test

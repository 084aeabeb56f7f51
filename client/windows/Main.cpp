#include <windows.h>

#include <iostream>
#include <string>
#include <vector>

#include "client/command/Commands.h"
#include "client/command/Program.h"
#include "client/windows/ConsoleStream.h"
#include "text/TextConversion.h"

namespace {

/// A console that shows all characters and understands the sequences that place a cursor; afterwards it is as
/// before.
class Console {
public:
    Console() : m_output(GetStdHandle(STD_OUTPUT_HANDLE)) {
        m_hasMode = GetConsoleMode(m_output, &m_mode) != 0;
        if (m_hasMode) SetConsoleMode(m_output, m_mode | ENABLE_VIRTUAL_TERMINAL_PROCESSING);
    }
    ~Console() {
        if (m_hasMode) SetConsoleMode(m_output, m_mode);
    }
    Console(const Console&) = delete;
    Console& operator=(const Console&) = delete;

private:
    const HANDLE m_output;
    DWORD m_mode = 0;
    bool m_hasMode = false;
};

}  // namespace

void vexa::client::addHostCommands(CLI::App& /*app*/, int& /*exitCode*/) {}

int wmain(int argc, wchar_t** argv) {
    std::vector<std::string> texts;
    std::vector<char*> arguments;
    texts.reserve(static_cast<std::size_t>(argc));
    for (int i = 0; i < argc; ++i)
        arguments.push_back(texts.emplace_back(vexa::utf8FromWide(argv[i])).data());
    arguments.push_back(nullptr);
    const Console console;
    const vexa::client::ConsoleStream output(std::cout, STD_OUTPUT_HANDLE);
    const vexa::client::ConsoleStream errors(std::cerr, STD_ERROR_HANDLE);
    return vexa::client::runProgram(argc, arguments.data());
}

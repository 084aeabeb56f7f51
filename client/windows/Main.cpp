#include <windows.h>

#include <string>
#include <vector>

#include "base/TextConversion.h"
#include "client/Commands.h"
#include "client/Program.h"

namespace {

/// A console that shows UTF-8 and understands the sequences that place a cursor; afterwards it is as before.
class Console {
public:
    Console() : m_output(GetStdHandle(STD_OUTPUT_HANDLE)), m_codePage(GetConsoleOutputCP()) {
        SetConsoleOutputCP(CP_UTF8);
        m_hasMode = GetConsoleMode(m_output, &m_mode) != 0;
        if (m_hasMode) SetConsoleMode(m_output, m_mode | ENABLE_VIRTUAL_TERMINAL_PROCESSING);
    }
    ~Console() {
        if (m_hasMode) SetConsoleMode(m_output, m_mode);
        if (m_codePage != 0) SetConsoleOutputCP(m_codePage);
    }
    Console(const Console&) = delete;
    Console& operator=(const Console&) = delete;

private:
    const HANDLE m_output;
    const UINT m_codePage;
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
    return vexa::client::runProgram(argc, arguments.data());
}

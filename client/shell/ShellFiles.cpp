#include "client/shell/ShellFiles.h"

#include <algorithm>
#include <array>
#include <fstream>

#include "client/shell/Completion.h"
#include "client/shell/ManPage.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

struct Shell {
    const char* name;
    std::string (*script)(const CommandText& program);
    const char* file;
};
constexpr std::array kShells{
    Shell{"bash", bashCompletion, "bash-completion/completions/vexa"},
    Shell{"zsh", zshCompletion, "zsh/vendor-completions/_vexa"},
    Shell{"fish", fishCompletion, "fish/vendor_completions.d/vexa.fish"},
    Shell{"powershell", powerShellCompletion, "vexa.ps1"},
};

void write(const std::filesystem::path& path, const std::string& text) {
    std::error_code error;
    std::filesystem::create_directories(path.parent_path(), error);
    std::ofstream file(path, std::ios::binary);
    if (!(file << text).flush()) throw ClientError(path.string() + " cannot be written");
}

}  // namespace

std::string completionFor(const std::string& shell, const CommandText& program) {
    const auto* const known =
        std::find_if(kShells.begin(), kShells.end(), [&](const Shell& one) { return one.name == shell; });
    return known == kShells.end() ? "" : known->script(program);
}

void writeShellFiles(const std::filesystem::path& folder, const CommandText& program) {
    for (const Shell& shell : kShells)
        write(folder / shell.file, shell.script(program));
    for (const CommandText* command : allCommands(program))
        write(folder / "man" / "man1" / (manPageName(*command) + ".1"), manPage(program, *command));
}

}  // namespace vexa::client

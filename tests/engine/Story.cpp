#include "engine/Story.h"

#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cstdio>
#include <exception>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "platform/seeded/Seeded.h"

namespace vexa::test {

namespace {

namespace fs = std::filesystem;

class Pipe {
public:
    Pipe() {
        if (pipe(m_ends.data()) != 0) std::perror("pipe");
    }

    void write(const std::string& text) const {
        for (std::size_t done = 0; done < text.size();) {
            const ssize_t written = ::write(m_ends[1], text.data() + done, text.size() - done);
            if (written <= 0) return;
            done += static_cast<std::size_t>(written);
        }
    }

    std::string readAll() {
        close(m_ends[1]);
        std::string text;
        std::array<char, 65536> buffer{};
        for (;;) {
            const ssize_t count = read(m_ends[0], buffer.data(), buffer.size());
            if (count <= 0) break;
            text.append(buffer.data(), static_cast<std::size_t>(count));
        }
        close(m_ends[0]);
        return text;
    }

private:
    std::array<int, 2> m_ends{};
};

std::string contentOf(const fs::path& file) {
    const std::ifstream stream(file, std::ios::binary);
    std::ostringstream content;
    content << stream.rdbuf();
    return content.str();
}

// On standard error, where the parent finds it beside reports of the sanitizers.
void tell(const std::string& text) {
    std::fprintf(stderr, "%s\n", text.c_str());
}

[[noreturn]] void live(std::uint64_t seed, const std::string& scenario, const fs::path& folder,
                       const std::function<std::string(World&)>& story, const Pipe& result) {
    int exitCode = 1;
    platform::runSeeded(seed, [&] {
        World world(scenario, folder);
        try {
            result.write(story(world));
        } catch (const std::exception& fault) {
            tell(std::string("The story broke off: ") + fault.what() + "\n" + world.log());
        }
        exitCode = world.stop();
    });
    std::fflush(nullptr);
    _exit(exitCode);
}

}  // namespace

Ending runStory(std::uint64_t seed, const std::string& scenario,
                const std::function<std::string(World&)>& story) {
    std::string pattern = (fs::temp_directory_path() / "vexa-story-XXXXXX").string();
    const fs::path folder = mkdtemp(pattern.data());
    const fs::path errors = folder / "stderr.txt";
    Pipe result;
    const pid_t child = fork();
    if (child == 0) {
        if (std::freopen("/dev/null", "w", stdout) == nullptr) _exit(1);
        if (std::freopen(errors.c_str(), "w", stderr) == nullptr) _exit(1);
        live(seed, scenario, folder, story, result);
    }
    Ending ending;
    ending.text = result.readAll();
    int status = 0;
    waitpid(child, &status, 0);
    ending.errors = contentOf(errors);
    ending.isOrderly = WIFEXITED(status) && WEXITSTATUS(status) == 0;
    if (!ending.isOrderly)
        ending.errors += "\nSeed " + std::to_string(seed) + " ended with status " + std::to_string(status);
    fs::remove_all(folder);
    return ending;
}

}  // namespace vexa::test

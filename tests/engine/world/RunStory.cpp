#include "engine/world/RunStory.h"

#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <fstream>

#include "platform/seeded/Seeded.h"

namespace vexa::test {

namespace {

namespace fs = std::filesystem;

// What differs goes to standard error, where reports of a deadlock and of the sanitizers are as well.
[[noreturn]] void live(const Run& run, const std::string& scenario, const fs::path& folder,
                       const Tale& tale) {
    int exitCode = 1;
    platform::runSeeded(run.seed, [&] {
        Story story(scenario, folder, run.log.value_or(run.seed % 2 == 1));
        try {
            tale(story);
        } catch (const std::exception& fault) {
            story.expect("the story's end", fault.what(), "");
        }
        std::ofstream(folder / "told.txt", std::ios::binary) << story.told();
        const bool isFine = story.differences().empty();
        if (!isFine) std::fputs((story.differences() + "The log:\n" + story.log()).c_str(), stderr);
        exitCode = story.stop();
        if (exitCode == 0 && !isFine) exitCode = 1;
    });
    std::fflush(nullptr);
    _exit(exitCode);
}

Ending runOnce(const Run& run, const std::string& scenario, const Tale& tale) {
    std::string pattern = (fs::temp_directory_path() / "vexa-story-XXXXXX").string();
    const fs::path folder = mkdtemp(pattern.data());
    const fs::path errors = folder / "stderr.txt";
    std::fflush(nullptr);
    const pid_t child = fork();
    if (child == 0) {
        if (std::freopen((folder / "stdout.txt").c_str(), "w", stdout) == nullptr) _exit(1);
        if (std::freopen(errors.c_str(), "w", stderr) == nullptr) _exit(1);
        live(run, scenario, folder, tale);
    }
    int status = 0;
    waitpid(child, &status, 0);
    Ending ending{"", contentOf(folder / "told.txt")};
    if (status != 0)
        ending.wrong = "Seed " + std::to_string(run.seed) + " ended with status " + std::to_string(status) +
                       ":\n" + contentOf(errors);
    fs::remove_all(folder);
    return ending;
}

int seedsOf(const Run& run) {
    const char* const text = std::getenv("VEXA_STORY_SEEDS");
    return text == nullptr ? run.seeds : std::max(run.seeds, std::atoi(text));
}

}  // namespace

Ending runStory(const Run& run, const std::string& scenario, const Tale& tale) {
    Ending ending;
    Run next = run;
    for (int left = seedsOf(run); left > 0 && ending.wrong.empty(); --left, ++next.seed)
        ending = runOnce(next, scenario, tale);
    return ending;
}

std::string wrongIn(const Run& run, const std::string& scenario, const Tale& tale) {
    return runStory(run, scenario, tale).wrong;
}

std::string wrongIn(const std::string& scenario, const Tale& tale) {
    return wrongIn({.seeds = 2}, scenario, tale);
}

}  // namespace vexa::test

// Storms on the seeded scheduler, as many as one likes: a process of its own for each, and the seeds that
// failed.

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>

#include "engine/storm/StormSteps.h"
#include "engine/world/RunStory.h"

namespace {

using namespace vexa::test;

struct Options {
    bool connections = false;
    std::uint64_t seeds = 100;
    std::uint64_t from = 1;
    std::uint64_t steps = 48;
};

bool readOptions(int count, char** arguments, Options& options) {
    for (int i = 1; i < count; ++i) {
        const std::string name = arguments[i];
        std::uint64_t* const number = name == "--seeds"   ? &options.seeds
                                      : name == "--from"  ? &options.from
                                      : name == "--steps" ? &options.steps
                                                          : nullptr;
        if (name == "--connections") {
            options.connections = true;
            continue;
        }
        if (number == nullptr || ++i == count) return false;
        char* end = nullptr;
        *number = std::strtoull(arguments[i], &end, 10);
        if (end == arguments[i] || *end != '\0') return false;
    }
    return true;
}

bool isCalm(std::uint64_t seed, const Options& options) {
    const Ending ending = runStory({.seed = seed}, Storm::scenario(1), [&](Story& story) {
        const int steps = static_cast<int>(options.steps);
        story.expect("storm",
                     options.connections ? stormOfConnections(story, seed, steps) : storm(story, seed, steps),
                     "");
    });
    std::fputs(ending.wrong.c_str(), stdout);
    std::fflush(stdout);
    return ending.wrong.empty();
}

}  // namespace

int main(int count, char** arguments) {
    Options options;
    if (!readOptions(count, arguments, options)) {
        std::fputs("usage: storm [--connections] [--seeds N] [--from S] [--steps N]\n", stderr);
        return 2;
    }
    std::uint64_t failed = 0;
    for (std::uint64_t i = 0; i < options.seeds; ++i)
        if (!isCalm(options.from + i, options)) ++failed;
    std::printf("%ju storms, %ju failed\n", std::uintmax_t{options.seeds}, std::uintmax_t{failed});
    return failed == 0 ? 0 : 1;
}

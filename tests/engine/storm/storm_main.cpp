// Storms on the seeded scheduler, as many as one likes: a process of its own for each, and the seeds that
// failed.

#include <charconv>
#include <cstdint>
#include <cstdio>
#include <string>
#include <string_view>

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

bool readNumber(std::string_view text, std::uint64_t& number) {
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    return error == std::errc() && end == text.data() + text.size() && !text.empty();
}

bool readOptions(int count, char** arguments, Options& options) {
    for (int i = 1; i < count; ++i) {
        const std::string_view name = arguments[i];
        std::uint64_t* const number = name == "--seeds"   ? &options.seeds
                                      : name == "--from"  ? &options.from
                                      : name == "--steps" ? &options.steps
                                                          : nullptr;
        if (name == "--connections")
            options.connections = true;
        else if (number == nullptr || ++i == count || !readNumber(arguments[i], *number))
            return false;
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
    std::printf("%llu storms, %llu failed\n", static_cast<unsigned long long>(options.seeds),
                static_cast<unsigned long long>(failed));
    return failed == 0 ? 0 : 1;
}

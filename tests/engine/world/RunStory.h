#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>

#include "engine/world/Story.h"

namespace vexa::test {

/// How a story is told.
struct Run {
    std::uint64_t seed = 1;
    int seeds = 1;  ///< so many, from `seed` on; VEXA_STORY_SEEDS in the environment makes it more
    std::optional<bool> log = {};  ///< the diagnostic log; where nothing is said odd seeds have it on
};

using Tale = std::function<void(Story&)>;

/// How a story ended.
struct Ending {
    std::string wrong;  ///< The seed, what differs, the log and standard error; nothing: all was as expected.
    std::string told;   ///< Under the last seed.
};

/// Runs a story on a machine with this scenario (a JSON object), under each seed in a process of its own as
/// the real service: nothing of one story is left for the next. The service is up when the story begins and
/// has to stop in order after it. Ends with the first seed that went wrong.
Ending runStory(const Run& run, const std::string& scenario, const Tale& tale);

/// Its `wrong` alone; for the macro below. Without a run there are two, with the log on and off.
std::string wrongIn(const Run& run, const std::string& scenario, const Tale& tale);
std::string wrongIn(const std::string& scenario, const Tale& tale);

}  // namespace vexa::test

/// EXPECT_STORY(scenario, tale) or EXPECT_STORY(run, scenario, tale): nothing goes wrong.
#define EXPECT_STORY(...)                                                                           \
    GTEST_AMBIGUOUS_ELSE_BLOCKER_                                                                   \
    if (const std::string wrongInStory = ::vexa::test::wrongIn(__VA_ARGS__); !wrongInStory.empty()) \
    ADD_FAILURE() << wrongInStory

/// A test that is one such story: its body follows.
#define STORY(suite, name, ...)                          \
    static void suite##name(::vexa::test::Story& story); \
    TEST(suite, name) {                                  \
        EXPECT_STORY(__VA_ARGS__, suite##name);          \
    }                                                    \
    static void suite##name(::vexa::test::Story& story)

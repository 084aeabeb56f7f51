#pragma once

#include <cstdint>
#include <functional>
#include <string>

#include "engine/World.h"

namespace vexa::test {

/// How a story ended.
struct Ending {
    bool isOrderly = false;  ///< Ran to its end, with the service's exit code 0.
    std::string text;        ///< What the story gave.
    std::string errors;      ///< Standard error: a deadlock's report, a sanitizer's, a failed check's.
};

/// Runs a story under a seed on a machine with this scenario (a JSON object), in a process of its own as the
/// real service: nothing of one story is left for the next. The service is up when the story begins and is
/// stopped after it.
Ending runStory(std::uint64_t seed, const std::string& scenario,
                const std::function<std::string(World&)>& story);

}  // namespace vexa::test

// One long storm on real threads, for the sanitizers: nothing but the operating system decides who runs when.

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>

#include "engine/StormSteps.h"
#include "platform/ClockControl.h"

int main(int count, char** arguments) {
    using namespace vexa;
    using namespace vexa::test;
    constexpr double kSpeed = 1000;
    const int steps = count > 1 ? std::atoi(arguments[1]) : 10000;
    const std::uint64_t seed = count > 2 ? std::strtoull(arguments[2], nullptr, 10) : 1;
    std::string pattern = (std::filesystem::temp_directory_path() / "vexa-storm-XXXXXX").string();
    const std::filesystem::path folder = mkdtemp(pattern.data());
    std::string wrong;
    int exitCode = 0;
    {
        platform::setClockSpeed(kSpeed);
        World world(Storm::scenario(kSpeed), folder);
        wrong = storm(world, seed, steps, platform::sleepFor);
        exitCode = world.stop();
    }
    std::filesystem::remove_all(folder);
    std::fprintf(stderr, "%d steps with seed %llu, exit code %d\n%s", steps,
                 static_cast<unsigned long long>(seed), exitCode, wrong.c_str());
    std::fflush(nullptr);
    _exit(exitCode == 0 && wrong.empty() ? 0 : 1);
}

// One long storm on real threads, for the sanitizers: nothing but the operating system decides who runs when.
// Time runs by itself; in a storm of connections, which promises what happens within a minute, it moves on
// when all threads rest. An odd seed has the log on.

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <string_view>

#include "engine/storm/StormSteps.h"
#include "platform/ClockControl.h"

namespace {

using namespace vexa;
using namespace vexa::test;

constexpr double kSpeed = 1000;

}  // namespace

int main(int count, char** arguments) {
    const int steps = count > 1 ? std::atoi(arguments[1]) : 10000;
    const std::uint64_t seed = count > 2 ? std::strtoull(arguments[2], nullptr, 10) : 1;
    const bool isOfConnections = count > 3 && std::string_view(arguments[3]) == "connections";
    std::string pattern = (std::filesystem::temp_directory_path() / "vexa-storm-XXXXXX").string();
    const std::filesystem::path folder = mkdtemp(pattern.data());
    ::setenv("VEXA_MACHINE", folder.c_str(), 1);  // named mutexes live in it, and another storm has its own
    std::string wrong;
    int exitCode = 0;
    {
        const double speed = isOfConnections ? 0 : kSpeed;
        platform::setClockSpeed(speed);
        World world(Storm::scenario(speed), folder, seed % 2 == 1);
        wrong = isOfConnections ? stormOfConnections(world, seed, steps)
                                : storm(world, seed, steps, platform::sleepFor);
        exitCode = world.stop();
    }
    std::filesystem::remove_all(folder);
    std::fprintf(stderr, "%d steps with seed %ju, exit code %d\n%s", steps, std::uintmax_t{seed}, exitCode,
                 wrong.c_str());
    std::fflush(nullptr);
    _exit(exitCode == 0 && wrong.empty() ? 0 : 1);
}

// One long storm on real threads, for the sanitizers: nothing but the operating system decides who runs when.
// Time runs by itself; in a storm of connections, which promises what happens within a minute, it moves on
// when all threads rest.

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

struct Options {
    int steps = 10000;
    std::uint64_t seed = 1;
    bool connections = false;
};

Options readOptions(int count, char** arguments) {
    Options options;
    if (count > 1) options.steps = std::atoi(arguments[1]);
    if (count > 2) options.seed = std::strtoull(arguments[2], nullptr, 10);
    options.connections = count > 3 && std::string_view(arguments[3]) == "connections";
    return options;
}

std::string storms(World& world, const Options& options) {
    return options.connections ? stormOfConnections(world, options.seed, options.steps)
                               : storm(world, options.seed, options.steps, platform::sleepFor);
}

}  // namespace

int main(int count, char** arguments) {
    const Options options = readOptions(count, arguments);
    std::string pattern = (std::filesystem::temp_directory_path() / "vexa-storm-XXXXXX").string();
    const std::filesystem::path folder = mkdtemp(pattern.data());
    ::setenv("VEXA_MACHINE", folder.c_str(), 1);  // named mutexes live in it, and another storm has its own
    std::string wrong;
    int exitCode = 0;
    {
        const double speed = options.connections ? 0 : kSpeed;
        platform::setClockSpeed(speed);
        World world(Storm::scenario(speed), folder);
        wrong = storms(world, options);
        exitCode = world.stop();
    }
    std::filesystem::remove_all(folder);
    std::fprintf(stderr, "%d steps with seed %llu, exit code %d\n%s", options.steps,
                 static_cast<unsigned long long>(options.seed), exitCode, wrong.c_str());
    std::fflush(nullptr);
    _exit(exitCode == 0 && wrong.empty() ? 0 : 1);
}

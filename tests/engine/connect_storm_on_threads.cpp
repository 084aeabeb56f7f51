// A long storm of connections on real threads, for the sanitizers.

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>

#include "engine/StormSteps.h"
#include "engine/connect_calm.h"

int main(int count, char** arguments) {
    using namespace vexa::test;
    using namespace std::chrono_literals;
    const int steps = count > 1 ? std::atoi(arguments[1]) : 1000;
    const std::uint64_t seed = count > 2 ? std::strtoull(arguments[2], nullptr, 10) : 1;
    std::string pattern = (std::filesystem::temp_directory_path() / "vexa-storm-XXXXXX").string();
    const std::filesystem::path folder = mkdtemp(pattern.data());
    std::string wrong;
    int exitCode = 0;
    {
        // The machine's clock runs on while a sanitizer is slow, so there is patience.
        World world(Storm::scenario(500), folder);
        wrong = stormOfConnections(world, seed, steps, 1h);
        exitCode = world.stop();
    }
    std::filesystem::remove_all(folder);
    std::fprintf(stderr, "%d steps with seed %llu, exit code %d\n%s", steps,
                 static_cast<unsigned long long>(seed), exitCode, wrong.c_str());
    std::fflush(nullptr);
    _exit(exitCode == 0 && wrong.empty() ? 0 : 1);
}

#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>

#include "channel/IpcInProcess.h"
#include "engine/world/World.h"
#include "platform/ClockControl.h"
#include "platform/Thread.h"
#include "platform/seeded/Seeded.h"
#include "service/IpcServers.h"
#include "simulation/Machine.h"
#include "simulation/scenario/Scenario.h"

namespace vexa::test {
namespace {

using namespace std::chrono_literals;

constexpr std::int32_t kSpectral = 2100;
constexpr std::int32_t kHotspot = 2101;

std::unique_ptr<InProcessClient> askAtOnce(std::int32_t port, const std::string& command) {
    std::unique_ptr<InProcessClient> client;
    while (!client)
        client = InProcessClient::connect(port);
    client->send(sending(command));
    return client;
}

bool hasAnswer(InProcessClient& client, const std::string& name) {
    for (const std::string& event : client.receive())
        if (event.find(name) != std::string::npos) return true;
    return false;
}

// Ends the process: 0 if both clients are answered.
[[noreturn]] void askWhilePortsOpen(std::uint64_t seed, const std::filesystem::path& folder) {
    platform::runSeeded(seed, [&] {
        simulation::Machine machine(simulation::parseScenario("{}"), folder);
        platform::Thread opening;
        opening.start("opening", [] { createIpcServers(kSpectral, kHotspot); });
        const auto hotspot = askAtOnce(kHotspot, "GET_IS_CARD_IN");
        const auto spectral = askAtOnce(kSpectral, "GET_CURRENT_CHANNEL");
        platform::advance(1s);
        const bool areAnswered = hasAnswer(*hotspot, "CARD_PLUG_IN") &&
                                 hasAnswer(*spectral, "SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA");
        _exit(areAnswered ? 0 : 1);
    });
    _exit(2);
}

// Between the opening of a port and the knowledge of the handle by which to answer is room for a message.
TEST(ServiceStart, AClientThatIsFasterThanTheServiceIsAnswered) {
    std::string pattern = (std::filesystem::temp_directory_path() / "vexa-start-XXXXXX").string();
    const std::filesystem::path folder = mkdtemp(pattern.data());
    for (std::uint64_t seed = 1; seed <= 200; ++seed)
        EXPECT_EXIT(askWhilePortsOpen(seed, folder), testing::ExitedWithCode(0), "") << "seed " << seed;
    std::filesystem::remove_all(folder);
}

}  // namespace
}  // namespace vexa::test

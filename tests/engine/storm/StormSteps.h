#pragma once

#include <cstdint>
#include <functional>
#include <random>
#include <string>
#include <vector>

#include "engine/world/World.h"

namespace vexa::test {

/// A random walk through what can happen to a machine and its service: the air, the adapter, connections,
/// faults, notifications of any form, and the commands of both ports. It keeps account of the networks in
/// range, so that the list shown can be held to the list last reported.
class Storm {
public:
    /// The scenario that a storm needs. `speed` as in a scenario file.
    static std::string scenario(double speed);

    /// Lets time pass. Without one the world's clock is moved on; real threads need time that goes by itself.
    using Pass = std::function<void(platform::Duration)>;

    Storm(World& world, std::uint64_t seed, Pass pass = nullptr);

    /// One action of the machine and some commands of its clients.
    void step();

    /// Brings the adapter, its radio and the hotspot function back, has the networks reported, and compares
    /// what the client is shown. Gives what is wrong, empty if nothing is.
    std::string check();

private:
    struct Bss {
        std::string name;
        bool isVisible = true;
        bool isReported = true;
    };

    std::string changeOfTheAir();
    void sendCommands();
    bool hear();
    bool waitForAnswers();
    std::string namesInRange() const;

    World& m_world;
    std::mt19937_64 m_random;
    const Pass m_pass;
    std::string m_shown;
    std::vector<Bss> m_air;
};

/// A whole storm of this many steps, with a check now and then. Gives what is wrong.
std::string storm(World& world, std::uint64_t seed, int steps, Storm::Pass pass = nullptr);

/// The same in which credentials may connect by themselves. Behind each part of it all that stands in the way
/// of a connection is undone, a network that lets in a credential of its own is shown, and the engine is left
/// alone: it has to be connected within a minute.
std::string stormOfConnections(World& world, std::uint64_t seed, int steps);

}  // namespace vexa::test

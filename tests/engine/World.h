#pragma once

#include <json/value.h>

#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "channel/IpcInProcess.h"
#include "platform/Clock.h"
#include "platform/NamedMutex.h"
#include "platform/Thread.h"
#include "simulation/Machine.h"

namespace vexa::test {

/// One event that a client got, its `Data` parsed where it is JSON.
struct ClientEvent {
    std::string id;
    std::string source;
    bool hasData;
    std::string dataText;
    Json::Value data;
};

/// A client of one port, in the process.
class Client {
public:
    explicit Client(std::int32_t port);

    void send(const std::string& command, const std::string& data = "");
    void sendRaw(const std::string& text) { m_client->send(text); }

    /// Events since the last call, oldest first.
    std::vector<ClientEvent> events();

    /// Their ids, joined by blanks.
    std::string ids();

    /// All that ever came, as it came.
    const std::string& transcript() const { return m_transcript; }

private:
    std::unique_ptr<InProcessClient> m_client;
    std::string m_transcript;
};

/// A simulated machine with the service running on it and a client on each port. Lives on a thread of the
/// seeded world. Time passes by advance() alone, as far as the story is concerned.
class World {
public:
    World(const std::string& scenario, const std::filesystem::path& folder);

    /// Carries out an action or query of the control channel; throws if it is refused.
    Json::Value perform(const std::string& message);

    /// Lets this time pass and everything come to rest that falls due in it.
    void advance(platform::Duration span);

    /// Everything that the diagnostic log wrote so far.
    std::string log();
    std::size_t logSize();
    /// The text of config.xml, and the folder that holds it.
    std::string config() const;
    std::filesystem::path store() const;

    /// One line per call.
    std::string debugLog() const;

    Client& spectral() { return *m_spectral; }
    Client& hotspot() { return *m_hotspot; }

    /// Releases the stop mutex and gives the service's exit code.
    int stop();

private:
    std::filesystem::path logFile() const;

    std::filesystem::path m_folder;
    simulation::Machine m_machine;
    std::unique_ptr<platform::NamedMutex> m_stopMutex;
    platform::Thread m_service;
    int m_exitCode = -1;
    std::unique_ptr<Client> m_spectral;
    std::unique_ptr<Client> m_hotspot;
};

}  // namespace vexa::test

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

/// Null if the text is no JSON.
Json::Value parsed(const std::string& text);

/// In one line, without blanks.
std::string compact(const Json::Value& value);

std::string contentOf(const std::filesystem::path& file);

/// The text of an action: doing("radio", R"("software":"off")").
std::string doing(const std::string& action, const std::string& members = "");

/// The action of letting this time pass, and everything come to rest that falls due in it.
std::string passing(platform::Duration span);

/// The text of a client's message.
std::string sending(const std::string& command, const std::string& data = "");

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

    void send(const std::string& command, const std::string& data = "") { sendRaw(sending(command, data)); }
    void sendRaw(const std::string& text) { m_client->send(text); }

    /// Events since the last call, oldest first.
    std::vector<ClientEvent> events();

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
    /// The diagnostic log is on in a scenario that brings no configuration of its own; without `withLog` it
    /// is off in any.
    World(const std::string& scenario, const std::filesystem::path& folder, bool withLog = true);

    /// Carries out an action or query of the control channel; throws if it is refused.
    Json::Value perform(const std::string& message);
    void act(const std::string& action, const std::string& members = "") { perform(doing(action, members)); }

    /// Lets this time pass and everything come to rest that falls due in it.
    void advance(platform::Duration span);

    /// Lets all this happen: actions, and messages to the hotspot port, each of which is carried out before
    /// the next deed.
    void play(const std::vector<std::string>& deeds);
    void order(const std::string& command, const std::string& data = "") { play({sending(command, data)}); }

    /// From now on requests, events and the messages of the log count anew.
    void forget();

    /// Everything that the diagnostic log wrote so far.
    std::string log();
    /// Its messages since the last forget(), without numbers, times and empty lines.
    std::string messages();

    std::string config() const { return contentOf(store() / "config.xml"); }
    void writeConfig(const std::string& text);
    /// The folder that holds config.xml.
    std::filesystem::path store() const { return m_folder / "Public" / "Roaming" / "Korvane"; }
    std::filesystem::path logFile() const { return store() / "Dump" / "hs20log.txt_user.txt"; }
    /// One line per call.
    std::string debugLog() const { return contentOf(m_folder / "debug.log"); }
    /// What went to standard output, in a story.
    std::string printed() const { return contentOf(m_folder / "stdout.txt"); }

    Client& spectral() { return *m_spectral; }
    Client& hotspot() { return *m_hotspot; }

    /// Releases the stop mutex and gives the service's exit code.
    int stop();

private:
    std::filesystem::path m_folder;
    simulation::Machine m_machine;
    std::unique_ptr<platform::NamedMutex> m_stopMutex;
    platform::Thread m_service;
    int m_exitCode = -1;
    std::unique_ptr<Client> m_spectral;
    std::unique_ptr<Client> m_hotspot;
    std::size_t m_forgotten = 0;  // of the log
};

}  // namespace vexa::test

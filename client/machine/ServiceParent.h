#pragma once

#include <cstdint>
#include <filesystem>
#include <map>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "client/machine/MachineFolder.h"
#include "client/machine/ServicePorts.h"
#include "client/machine/StopSource.h"
#include "client/machine/TcpPorts.h"
#include "platform/NamedMutex.h"

namespace vexa::client {

class ServiceProcess;

/// What a parent is asked to start. Port 0: any free one; no control port: no control channel.
struct StartRequest {
    std::string machine;
    std::string scenario;
    /// The machine has its own; the one of the environment is not for it.
    bool builtInScenario = false;
    std::uint16_t saPort = 0;
    std::uint16_t hs20Port = 0;
    std::optional<std::uint16_t> controlPort;
    std::string service;
};

/// The parent of one service: holds the mutex that keeps it running, and stops it by letting go. It never
/// leaves a process behind, whichever way it goes.
class ServiceParent {
public:
    enum class State { Ready, StopRequested, Ended };

    /// Takes the mutex and starts the service. Throws ClientError; warns of one port for both halves. `stop`
    /// must outlive it.
    ServiceParent(const StartRequest& request, StopSource& stop);

    /// Stops a service that still runs, without a word: what went wrong is told already, or is on its way.
    ~ServiceParent();
    ServiceParent(const ServiceParent&) = delete;
    ServiceParent& operator=(const ServiceParent&) = delete;

    /// Returns when all ports listen, when it is to stop, or when the service has ended. A service that
    /// listens to nothing for ten seconds is stopped, and ClientError thrown.
    State waitUntilReady();

    /// Returns when it is to stop, or when the service has ended, which it says.
    State waitForEnd();

    /// Lets the service stop and waits for that; kills it if it takes too long. Gives the exit code.
    int stop();

    /// The same for a machine that nobody needs any more: a service that takes longer than `patience` to stop
    /// is killed without a word, and counts as stopped well.
    int stopSoon(std::chrono::milliseconds patience);

    const ServicePorts& ports() const { return m_ports; }

    /// As ServiceProcess::exitCode().
    std::optional<int> exitCode();

private:
    void takeMutex();
    void choosePorts(const StartRequest& request);
    void start(const StartRequest& request);
    bool portsListen() const;
    bool portIsBusy() const;
    bool isOutputEmpty() const;
    bool waitForExit(std::chrono::milliseconds limit);
    void letGo();
    [[noreturn]] void giveUp();
    void reportEarlyEnd(int exitCode) const;

    StopSource& m_stop;
    MachineFolder m_folder;
    std::unique_ptr<platform::NamedMutex> m_mutex;
    ServicePorts m_ports;
    std::vector<ReservedPort> m_reserved;
    std::map<std::uint16_t, std::set<std::uint64_t>> m_listenersBefore;
    std::unique_ptr<ServiceProcess> m_process;
};

}  // namespace vexa::client

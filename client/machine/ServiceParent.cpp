#include "client/machine/ServiceParent.h"

#include <algorithm>
#include <filesystem>
#include <iostream>

#include "client/machine/ServiceHost.h"
#include "client/machine/ServiceProcess.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/WaitNotice.h"
#include "contract/Process.h"

namespace vexa::client {

namespace fs = std::filesystem;
using std::chrono::milliseconds;
using std::chrono::seconds;

namespace {

constexpr seconds kReadyLimit{10};
constexpr milliseconds kFirstCheck{10};
constexpr milliseconds kLongestCheck{100};
constexpr seconds kStopLimit{30};
constexpr seconds kGiveUpLimit{2};

// Its ports or its configuration: it does not say which.
constexpr int kServiceFailed = 1;
constexpr int kScenarioRefused = 2;
constexpr int kSignalBase = 128;
constexpr int kLastSignal = 64;

fs::path servicePath(const std::string& given) {
    return given.empty() ? serviceBesideThis() : fs::absolute(given);
}

std::set<std::uint16_t> wantedPorts(const ServicePorts& ports) {
    std::set<std::uint16_t> wanted{ports.sa, ports.hs20, ports.control};
    wanted.erase(0);
    return wanted;
}

// The service takes one port for both of its halves, and one of them has none then.
void checkPorts(const StartRequest& request) {
    const std::uint16_t control = request.controlPort.value_or(0);
    if (control != 0 && (control == request.saPort || control == request.hs20Port))
        throw ClientError("the control channel needs a port of its own, not " + std::to_string(control),
                          kExitWrongUse);
    if (request.saPort != 0 && request.saPort == request.hs20Port)
        std::cerr << "vexa: both halves have the port " << request.saPort
                  << ": the spectral analyser cannot be reached\n";
}

// As the exit code tells it, see ServiceProcess::exitCode().
std::string endOf(int exitCode) {
    const int signal = exitCode - kSignalBase;
    return signal > 0 && signal <= kLastSignal ? "was killed by signal " + std::to_string(signal)
                                               : "ended with exit code " + std::to_string(exitCode);
}

std::string portNames(const ServicePorts& ports) {
    std::string names;
    for (const std::uint16_t port : wantedPorts(ports))
        names += (names.empty() ? "" : ", ") + std::to_string(port);
    return names;
}

}  // namespace

ServiceParent::ServiceParent(const StartRequest& request, StopSource& stop)
    : m_stop(stop), m_folder(request.machine) {
    checkPorts(request);
    m_folder.create();
    takeMutex();
    choosePorts(request);
    start(request);
}

ServiceParent::~ServiceParent() {
    try {
        if (m_process && !m_process->exitCode()) stopSoon(kStopLimit);
    } catch (const std::exception&) {  // the process kills what still runs when it goes
    }
}

void ServiceParent::takeMutex() {
    enterMachine(m_folder);
    m_mutex = std::make_unique<platform::NamedMutex>(contract::kStopMutex, platform::NamedMutex::Owner::Yes);
    if (!m_mutex->isValid()) {
        throw ClientError("the stop mutex cannot be made in " + m_folder.path().string(), kExitNotStarted);
    }
    if (!m_mutex->isOwned()) {
        throw ClientError(
            "the machine " + m_folder.path().string() + " has a service already, started by another parent",
            kExitNotStarted);
    }
}

void ServiceParent::choosePorts(const StartRequest& request) {
    const TcpPorts table = TcpPorts::read();
    m_ports = {request.saPort, request.hs20Port, request.controlPort.value_or(0)};
    const auto choose = [&](std::uint16_t& port) {
        if (port != 0) return;
        m_reserved.push_back(table.reserveFree());
        port = m_reserved.back().port;
    };
    choose(m_ports.sa);
    choose(m_ports.hs20);
    if (request.controlPort) choose(m_ports.control);
    for (const std::uint16_t port : wantedPorts(m_ports))
        m_listenersBefore[port] = table.listeners(port);
}

void ServiceParent::start(const StartRequest& request) {
    ServiceProgram program;
    program.executable = servicePath(request.service);
    program.arguments = {std::to_string(m_ports.sa), std::to_string(m_ports.hs20)};
    describeMachine(program, m_folder, request, m_ports.control);
    program.outputFile = m_folder.outputFile();
    m_process = std::make_unique<ServiceProcess>(program);
}

ServiceParent::State ServiceParent::waitUntilReady() {
    const Deadline deadline = Deadline::in(kReadyLimit);
    WaitNotice notice("the service to listen on its ports");
    for (milliseconds pause = kFirstCheck;; pause = std::min(pause + milliseconds(1), kLongestCheck)) {
        if (const auto code = m_process->exitCode()) {
            reportEarlyEnd(*code);
            return State::Ended;
        }
        if (portsListen()) break;
        if (deadline.isOver()) giveUp();
        notice.tick();
        if (!m_stop.wait(Deadline::in(pause))) return State::StopRequested;
    }
    m_reserved.clear();
    if (!writePortsFile(m_folder.portsFile(), m_ports)) {
        std::cerr << "vexa: the ports cannot be written to " << m_folder.portsFile().string() << '\n';
    }
    return State::Ready;
}

ServiceParent::State ServiceParent::waitForEnd() {
    while (!m_process->exitCode()) {
        if (!m_stop.wait(Deadline::never())) return State::StopRequested;
    }
    std::cerr << "vexa: the service " << endOf(*m_process->exitCode()) << ", without being asked to stop\n";
    return State::Ended;
}

int ServiceParent::stop() {
    const auto before = m_process->exitCode();
    letGo();
    if (before) return *before;
    if (!waitForExit(kStopLimit)) {
        std::cerr << "vexa: the service did not stop within " << kStopLimit.count() << " s and was killed\n";
        m_process->kill();
    } else if (const int code = *m_process->exitCode(); code != 0) {
        std::cerr << "vexa: the service " << endOf(code) << " when it was asked to stop\n";
    }
    return m_process->exitCode().value_or(kExitFailed);
}

int ServiceParent::stopSoon(milliseconds patience) {
    letGo();
    if (waitForExit(patience)) return m_process->exitCode().value_or(kExitFailed);
    m_process->kill();
    return kExitOk;
}

std::optional<int> ServiceParent::exitCode() {
    return m_process->exitCode();
}

// A listener that was there before belongs to somebody else, even if the port is the one that we want.
bool ServiceParent::portsListen() const {
    const TcpPorts table = TcpPorts::readListeners();
    for (const auto& [port, before] : m_listenersBefore) {
        std::set<std::uint64_t> now = table.listeners(port);
        for (const std::uint64_t socket : before)
            now.erase(socket);
        if (now.empty()) return false;
    }
    return true;
}

bool ServiceParent::portIsBusy() const {
    const TcpPorts table = TcpPorts::read();
    const auto wanted = wantedPorts(m_ports);
    return std::any_of(wanted.begin(), wanted.end(), [&](std::uint16_t port) { return table.isBusy(port); });
}

// The service finishes what it is at, which can take it some seconds.
bool ServiceParent::waitForExit(milliseconds limit) {
    const Deadline deadline = Deadline::in(limit);
    WaitNotice notice("the service to end", WaitNotice::kNoWayOut);
    while (!m_process->exitCode()) {
        if (deadline.isOver()) return false;
        notice.tick();
        m_stop.wait(std::min(deadline, notice.due()));
    }
    return true;
}

void ServiceParent::letGo() {
    std::error_code ignored;
    fs::remove(m_folder.portsFile(), ignored);
    if (m_mutex->isOwned()) m_mutex->release();
}

void ServiceParent::giveUp() {
    letGo();
    if (!waitForExit(kGiveUpLimit)) m_process->kill();
    throw ClientError("the service did not listen on the ports " + portNames(m_ports) + " within " +
                          std::to_string(kReadyLimit.count()) + " s; its output is in " +
                          m_folder.outputFile().string(),
                      kExitNotStarted);
}

// The service says there what it could not ask about its ports.
bool ServiceParent::isOutputEmpty() const {
    std::error_code ec;
    return std::filesystem::file_size(m_folder.outputFile(), ec) == 0 || ec;
}

void ServiceParent::reportEarlyEnd(int exitCode) const {
    if (exitCode == kScenarioRefused) return;  // it has said so itself
    std::cerr << "vexa: the service " << endOf(exitCode) << " before it was ready: ";
    if (exitCode > kSignalBase) {
        std::cerr << "its output is in " << m_folder.outputFile().string() << '\n';
    } else if (exitCode == 0) {
        std::cerr << "another one seems to run on the machine " << m_folder.path().string() << '\n';
    } else if (exitCode == kServiceFailed && !portIsBusy() && isOutputEmpty()) {
        std::cerr << "its configuration file " << m_folder.configFile().string() << " cannot be read\n";
    } else {
        std::cerr << "one of the ports " << portNames(m_ports) << " may be busy; its output is in "
                  << m_folder.outputFile().string() << '\n';
    }
}

}  // namespace vexa::client

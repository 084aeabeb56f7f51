#include "client/record/ReplayPorts.h"

#include <utility>

#include "channel/Envelope.h"
#include "client/port/JsonLine.h"
#include "client/terminal/ClientError.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

using platform::LockGuard;

// Of the spectral events without data not even the member is there.
std::string textOf(const Event& event) {
    if (event.data.empty() && event.source != contract::kHotspotSource)
        return buildEnvelope(event.id, event.source);
    return buildEnvelope(event.id, event.source, event.data);
}

}  // namespace

ReplayPorts::ReplayPorts(std::uint16_t spectral, std::uint16_t hotspot)
    : m_spectral(open(RecordedPort::Spectral, spectral)), m_hotspot(open(RecordedPort::Hotspot, hotspot)) {
    const LockGuard lock(m_mutex);
    m_isOpen = true;
}

// They may be in receive() until they have stopped.
ReplayPorts::~ReplayPorts() {
    m_spectral->stop();
    m_hotspot->stop();
}

ReplayPorts::Server ReplayPorts::open(RecordedPort port, std::uint16_t number) {
    const auto handler = [this, port](IpcWebSocketServer::ClientId, std::string_view message) {
        receive(port, message);
    };
    auto server = IpcWebSocketServer::create(number, handler);
    if (!server) throw ClientError("the port " + std::to_string(number) + " is not free");
    return server;
}

void ReplayPorts::begin(const std::vector<RecordedEvent>& first) {
    ReplayedService service;
    for (const RecordedEvent& recorded : first)
        service.foresee(recorded);
    const LockGuard lock(m_mutex);
    m_service = std::move(service);
}

void ReplayPorts::tell(const RecordedEvent& recorded) {
    const LockGuard lock(m_mutex);
    m_service.take(recorded);
    serverOf(recorded.port)->sendToAll(textOf(recorded.event));
}

bool ReplayPorts::hasClients() const {
    return m_spectral->hasClients() || m_hotspot->hasClients();
}

std::vector<std::string> ReplayPorts::takeRefused() {
    const LockGuard lock(m_mutex);
    return std::exchange(m_refused, {});
}

// Answers go to everybody, as those of the service do.
void ReplayPorts::receive(RecordedPort port, std::string_view message) {
    const auto command = parseJsonObject(message);
    if (!command || !(*command)["CommandId"].isString()) return;
    const std::string id = (*command)["CommandId"].asString();
    const LockGuard lock(m_mutex);
    if (!m_isOpen) return;
    const auto answer = m_service.answer(port, id);
    for (const Event& event : answer.events)
        serverOf(port)->sendToAll(textOf(event));
    if (answer.isRefused) m_refused.push_back(id);
}

}  // namespace vexa::client

#include "client/panel/PanelRelay.h"

#include <chrono>
#include <utility>

#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

constexpr std::chrono::milliseconds kBetweenTries{300};

}  // namespace

PanelRelay::PanelRelay(boost::asio::io_context& context, const PortOption& spectral,
                       const PortOption& hotspot, Events events)
    : m_context(context),
      m_spectralOption(spectral),
      m_hotspotOption(hotspot),
      m_events(std::move(events)),
      m_pause(context) {}

PanelRelay::~PanelRelay() {
    dropBoth();
}

void PanelRelay::open() try {
    const std::uint16_t spectral = m_spectralOption.find();
    const std::uint16_t hotspot = m_hotspotOption.find();
    m_spectral = connect(RecordedPort::Spectral, spectral);
    m_hotspot = connect(RecordedPort::Hotspot, hotspot);
} catch (const ClientError&) {  // no service tells of itself
    openLater();
}

std::shared_ptr<PanelPort> PanelRelay::connect(RecordedPort port, std::uint16_t number) {
    PanelPort::Events events;
    events.opened = [this] { opened(); };
    events.told = [this, port](const std::string& message) {
        if (m_isRunning) m_events.told(port, message);
    };
    events.lost = [this] { lost(); };
    auto connection = std::make_shared<PanelPort>(m_context, std::move(events));
    connection->open(number);
    return connection;
}

void PanelRelay::opened() {
    if (++m_openCount < 2) return;
    m_isRunning = true;
    m_events.changed(true);
}

void PanelRelay::lost() {
    dropBoth();
    openLater();
    if (std::exchange(m_isRunning, false)) m_events.changed(false);
}

void PanelRelay::openLater() {
    m_pause.expires_after(kBetweenTries);
    m_pause.async_wait([this](boost::system::error_code cancelled) {
        if (!cancelled) open();
    });
}

void PanelRelay::dropBoth() {
    m_openCount = 0;
    for (auto* port : {&m_spectral, &m_hotspot}) {
        if (*port) (*port)->drop();
        port->reset();
    }
}

bool PanelRelay::send(RecordedPort port, std::string message) {
    if (!m_isRunning) return true;
    return (port == RecordedPort::Spectral ? m_spectral : m_hotspot)->send(std::move(message));
}

}  // namespace vexa::client

#pragma once

#include <boost/asio/io_context.hpp>
#include <boost/asio/steady_timer.hpp>
#include <functional>
#include <memory>
#include <optional>
#include <string>

#include "client/command/PortOption.h"
#include "client/panel/PanelPort.h"
#include "client/record/Recording.h"

namespace vexa::client {

/// Both ports of the service together. Once one is lost it looks for both anew, until it has both: the
/// service may have gone, and another one come, on other ports.
class PanelRelay {
public:
    struct Events {
        std::function<void(bool isRunning)> changed;
        std::function<void(RecordedPort port, const std::string& message)> told;
    };

    PanelRelay(boost::asio::io_context& context, const PortOption& spectral, const PortOption& hotspot,
               Events events);
    ~PanelRelay();
    PanelRelay(const PanelRelay&) = delete;
    PanelRelay& operator=(const PanelRelay&) = delete;

    /// Looks for the service at once, and goes on.
    void open();

    bool isRunning() const { return m_isRunning; }

    /// The machine of the service, where it is known.
    std::optional<MachineFolder> machine() const { return m_hotspotOption.machine(); }

    /// Forgotten while the service is away. False if it takes nothing more for now.
    bool send(RecordedPort port, std::string message);

private:
    std::shared_ptr<PanelPort> connect(RecordedPort port, std::uint16_t number);
    void opened();
    void lost();
    void openLater();
    void dropBoth();

    boost::asio::io_context& m_context;
    const PortOption& m_spectralOption;
    const PortOption& m_hotspotOption;
    const Events m_events;
    boost::asio::steady_timer m_pause;
    std::shared_ptr<PanelPort> m_spectral;
    std::shared_ptr<PanelPort> m_hotspot;
    int m_openCount = 0;
    bool m_isRunning = false;
};

}  // namespace vexa::client

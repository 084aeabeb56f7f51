#pragma once

#include <chrono>
#include <cstdint>
#include <string>
#include <vector>

#include "client/port/Event.h"
#include "client/port/WebSocketClient.h"
#include "client/spectrum/SpectralView.h"
#include "client/terminal/Deadline.h"

namespace vexa::client {

/// A conversation with the spectral port, and the view that comes from it. Every scan that was started is
/// stopped, at the latest when the object goes.
class SpectralScan {
public:
    /// An event, as it came and as it was taken.
    struct Told {
        std::string text;
        Event event;
        SpectralView::Update update;
    };

    /// Connects and asks for the channel list. Throws ClientError.
    explicit SpectralScan(std::uint16_t port);
    ~SpectralScan();
    SpectralScan(const SpectralScan&) = delete;
    SpectralScan& operator=(const SpectralScan&) = delete;

    void start();
    void stop();

    /// When renew() has something to do although nothing has come.
    Deadline wake() const { return m_scanning ? m_renewal : Deadline::never(); }

    /// Asks again for a scan that has told no value for a while. Another client may have stopped it, and
    /// nothing tells of that.
    void renew();

    /// Values have come again after it was asked for again.
    bool hasResumed() const { return m_hasResumed; }

    const SpectralView& view() const { return m_view; }

    Polled polled() const { return m_client.polled(); }

    /// Takes in what has arrived, without waiting. Throws ClientError when the connection is lost.
    std::vector<Told> process();

private:
    void ask();
    void takeValue();

    WebSocketClient m_client;
    SpectralView m_view;
    bool m_scanning = false;
    bool m_hasValues = false;
    bool m_isRenewed = false;
    bool m_hasResumed = false;
    Deadline::Clock::time_point m_asked;
    std::chrono::milliseconds m_patience{0};
    Deadline m_renewal = Deadline::never();
};

}  // namespace vexa::client

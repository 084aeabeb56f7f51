#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "client/port/Event.h"
#include "client/port/WebSocketClient.h"
#include "client/spectrum/SpectralView.h"

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

    const SpectralView& view() const { return m_view; }

    Polled polled() const { return m_client.polled(); }

    /// Takes in what has arrived, without waiting. Throws ClientError when the connection is lost.
    std::vector<Told> process();

private:
    WebSocketClient m_client;
    SpectralView m_view;
    bool m_scanning = false;
};

}  // namespace vexa::client

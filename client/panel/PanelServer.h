#pragma once

#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/steady_timer.hpp>
#include <cstdint>
#include <deque>
#include <memory>

#include "client/panel/Panel.h"
#include "client/panel/web/PanelAnswers.h"
#include "client/panel/web/PanelDoor.h"
#include "client/panel/web/PanelRecordings.h"
#include "client/panel/web/PanelSession.h"

namespace vexa::client {

/// Serves the page on a port of 127.0.0.1, to browsers of this account alone.
class PanelServer {
public:
    /// Port 0: a free one. Throws ClientError if it can't be had.
    PanelServer(boost::asio::io_context& context, std::uint16_t port, const PanelRecordings& recordings,
                Panel& panel);

    /// The address to open.
    std::string url() const { return m_door.url(); }

    void close();

private:
    void accept();
    void receive(boost::asio::ip::tcp::socket socket);
    void makeRoom();

    boost::asio::ip::tcp::acceptor m_acceptor;
    boost::asio::steady_timer m_pause;
    PanelDoor m_door;
    PanelAnswers m_answers;
    PanelPlaces m_places;
    std::deque<std::weak_ptr<PanelSession>> m_sessions;
};

}  // namespace vexa::client

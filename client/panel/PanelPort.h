#pragma once

#include <boost/asio/io_context.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/core/tcp_stream.hpp>
#include <boost/beast/websocket/stream.hpp>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <string>

namespace vexa::client {

/// One connection to a port of the service, without waiting. What is under way keeps it alive until drop().
class PanelPort : public std::enable_shared_from_this<PanelPort> {
public:
    struct Events {
        std::function<void()> opened;
        std::function<void(const std::string& message)> told;
        /// It couldn't be opened, or is over. Nothing follows.
        std::function<void()> lost;
    };

    PanelPort(boost::asio::io_context& context, Events events);

    void open(std::uint16_t port);

    /// False if the service takes nothing more: what was sent before still waits.
    bool send(std::string message);

    /// Nothing is told any more.
    void drop();

private:
    void shakeHands(std::uint16_t port);
    void read();
    void write();
    void lose();

    Events m_events;
    boost::beast::websocket::stream<boost::beast::tcp_stream> m_stream;
    boost::beast::flat_buffer m_buffer;
    std::deque<std::string> m_waiting;
    std::size_t m_waitingBytes = 0;
    bool m_isOpen = false;
};

}  // namespace vexa::client

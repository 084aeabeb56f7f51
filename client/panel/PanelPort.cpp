#include "client/panel/PanelPort.h"

#include <boost/asio/ip/tcp.hpp>
#include <boost/beast/core/buffers_to_string.hpp>
#include <chrono>
#include <utility>

namespace vexa::client {

namespace asio = boost::asio;
namespace beast = boost::beast;
namespace websocket = beast::websocket;
using asio::ip::tcp;
using beast::error_code;

namespace {

constexpr std::chrono::seconds kConnectLimit{2};
constexpr std::size_t kMostMessage = std::size_t{16} << 20;
constexpr std::size_t kMostWaiting = std::size_t{4} << 20;

}  // namespace

PanelPort::PanelPort(asio::io_context& context, Events events)
    : m_events(std::move(events)), m_stream(context) {}

void PanelPort::open(std::uint16_t port) {
    beast::tcp_stream& connection = beast::get_lowest_layer(m_stream);
    connection.expires_after(kConnectLimit);
    connection.async_connect(tcp::endpoint(asio::ip::address_v4::loopback(), port),
                             [self = shared_from_this(), port](error_code error) {
                                 error ? self->lose() : self->shakeHands(port);
                             });
}

void PanelPort::shakeHands(std::uint16_t port) {
    beast::tcp_stream& connection = beast::get_lowest_layer(m_stream);
    error_code ignored;
    // Else a second command waits until the first one is acknowledged.
    connection.socket().set_option(tcp::no_delay(true), ignored);
    connection.expires_never();
    m_stream.set_option(
        websocket::stream_base::timeout{kConnectLimit, websocket::stream_base::none(), false});
    m_stream.read_message_max(kMostMessage);
    m_stream.text(true);
    m_stream.async_handshake("127.0.0.1:" + std::to_string(port), "/",
                             [self = shared_from_this()](error_code error) {
                                 if (error) return self->lose();
                                 self->m_isOpen = true;
                                 self->read();
                                 if (self->m_events.opened) self->m_events.opened();
                             });
}

void PanelPort::read() {
    m_stream.async_read(m_buffer, [self = shared_from_this()](error_code error, std::size_t) {
        if (error) return self->lose();
        const std::string message = beast::buffers_to_string(self->m_buffer.data());
        self->m_buffer.consume(self->m_buffer.size());
        if (self->m_events.told) self->m_events.told(message);
        self->read();
    });
}

bool PanelPort::send(std::string message) {
    if (!m_isOpen) return true;
    if (!m_waiting.empty() && m_waitingBytes + message.size() > kMostWaiting) return false;
    m_waitingBytes += message.size();
    m_waiting.push_back(std::move(message));
    if (m_waiting.size() == 1) write();
    return true;
}

void PanelPort::write() {
    m_stream.async_write(asio::buffer(m_waiting.front()),
                         [self = shared_from_this()](error_code error, std::size_t) {
                             if (error) return self->lose();
                             self->m_waitingBytes -= self->m_waiting.front().size();
                             self->m_waiting.pop_front();
                             if (!self->m_waiting.empty()) self->write();
                         });
}

void PanelPort::lose() {
    const auto lost = std::exchange(m_events, {}).lost;
    drop();
    if (lost) lost();
}

void PanelPort::drop() {
    m_events = {};
    m_isOpen = false;
    beast::get_lowest_layer(m_stream).close();
}

}  // namespace vexa::client

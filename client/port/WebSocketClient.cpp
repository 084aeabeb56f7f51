#include "client/port/WebSocketClient.h"

#include <boost/asio/connect.hpp>
#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/beast/core/buffers_to_string.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/websocket/stream.hpp>
#include <deque>

#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace asio = boost::asio;
namespace beast = boost::beast;
using asio::ip::tcp;
using beast::error_code;

namespace {

constexpr std::chrono::seconds kConnectLimit{5};
constexpr std::chrono::milliseconds kGoodbyeLimit{1000};
constexpr std::size_t kMaxMessage = std::size_t{16} << 20;

std::string placeName(std::uint16_t port) {
    return "127.0.0.1:" + std::to_string(port);
}

}  // namespace

class WebSocketClient::Impl {
public:
    explicit Impl(std::uint16_t port) : m_stream(m_context) {
        const error_code error = connect(port);
        if (error == beast::websocket::error::upgrade_declined) {
            throw ClientError("what listens on port " + std::to_string(port) +
                              " does not let us in: it is no service, or that of another account");
        }
        if (error)
            throw ClientError("no service answers on port " + std::to_string(port) + ": " + error.message() +
                              "; `vexa start` starts one");
        m_open = true;
        m_stream.read_message_max(kMaxMessage);
        m_stream.text(true);
        read();
    }

    // Also where a socket is no small number, it fits: handles have 32 bits.
    Polled polled() {
        const auto descriptor = static_cast<int>(m_stream.next_layer().native_handle());
        return {descriptor, m_outgoing.empty() ? kReadable : static_cast<short>(kReadable | kWritable)};
    }
    bool isOpen() const { return m_open; }

    void process() {
        m_context.restart();
        m_context.poll();
    }

    void send(std::string text) {
        if (!m_open) return;
        m_outgoing.push_back(std::move(text));
        if (m_outgoing.size() == 1) write();
    }

    std::optional<std::string> take() {
        if (m_incoming.empty()) return std::nullopt;
        std::string message = std::move(m_incoming.front());
        m_incoming.pop_front();
        return message;
    }

    void close(std::chrono::milliseconds limit) {
        if (!m_open) return;
        m_closing = true;
        if (m_outgoing.empty()) sayGoodbye();
        m_context.restart();
        m_context.run_for(limit);
        m_open = false;
    }

private:
    error_code connect(std::uint16_t port) {
        error_code result = asio::error::timed_out;
        const tcp::endpoint endpoint(asio::ip::address_v4::loopback(), port);
        m_stream.next_layer().async_connect(endpoint, [&](error_code error) {
            result = error;
            if (error) return;
            // Else a second command waits until the first one is acknowledged.
            error_code ignored;
            m_stream.next_layer().set_option(tcp::no_delay(true), ignored);
            result = asio::error::timed_out;
            m_stream.async_handshake(placeName(port), "/", [&](error_code outcome) { result = outcome; });
        });
        m_context.run_for(kConnectLimit);
        return result;
    }

    void read() {
        m_stream.async_read(m_buffer, [this](error_code error, std::size_t) {
            if (error) {
                m_open = false;
                return;
            }
            m_incoming.push_back(beast::buffers_to_string(m_buffer.data()));
            m_buffer.consume(m_buffer.size());
            read();
        });
    }

    void write() {
        m_stream.async_write(asio::buffer(m_outgoing.front()), [this](error_code error, std::size_t) {
            if (error) {
                m_open = false;
                m_outgoing.clear();
                return;
            }
            m_outgoing.pop_front();
            if (!m_outgoing.empty()) {
                write();
            } else if (m_closing) {
                sayGoodbye();
            }
        });
    }

    void sayGoodbye() {
        m_stream.async_close(beast::websocket::close_code::normal, [](error_code) {});
    }

    asio::io_context m_context{1};
    beast::websocket::stream<tcp::socket> m_stream;
    beast::flat_buffer m_buffer;
    std::deque<std::string> m_incoming;
    std::deque<std::string> m_outgoing;
    bool m_open = false;
    bool m_closing = false;
};

WebSocketClient::WebSocketClient(std::uint16_t port) : m_impl(std::make_unique<Impl>(port)) {}
WebSocketClient::~WebSocketClient() {
    try {
        m_impl->close(kGoodbyeLimit);
    } catch (const std::exception&) {  // a peer that has gone needs no goodbye
    }
}

Polled WebSocketClient::polled() const {
    return m_impl->polled();
}
void WebSocketClient::process() {
    m_impl->process();
}
void WebSocketClient::send(std::string text) {
    m_impl->send(std::move(text));
}
std::optional<std::string> WebSocketClient::take() {
    return m_impl->take();
}
void WebSocketClient::requireOpen() const {
    if (!m_impl->isOpen()) throw NoAnswer("the service has closed the connection");
}
void WebSocketClient::close(std::chrono::milliseconds limit) {
    m_impl->close(limit);
}

}  // namespace vexa::client

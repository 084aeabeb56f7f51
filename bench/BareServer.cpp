#include "bench/BareServer.h"

#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/post.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/core/tcp_stream.hpp>
#include <boost/beast/websocket.hpp>
#include <list>
#include <thread>
#include <utility>

namespace vexa::bench {

namespace {

namespace asio = boost::asio;
namespace beast = boost::beast;
namespace websocket = beast::websocket;
using asio::ip::tcp;
using boost::system::error_code;

const tcp::endpoint kAnyPort{asio::ip::address_v4::loopback(), 0};

class EchoSession : public std::enable_shared_from_this<EchoSession> {
public:
    explicit EchoSession(tcp::socket socket) : m_stream(std::move(socket)) {}

    void start() {
        beast::get_lowest_layer(m_stream).socket().set_option(tcp::no_delay(true));
        m_stream.text(true);
        m_stream.async_accept([self = shared_from_this()](error_code ec) {
            if (!ec) self->read();
        });
    }

private:
    void read() {
        m_stream.async_read(m_buffer, [self = shared_from_this()](error_code ec, std::size_t) {
            if (!ec) self->write();
        });
    }

    void write() {
        m_stream.async_write(m_buffer.data(), [self = shared_from_this()](error_code ec, std::size_t) {
            if (ec) return;
            self->m_buffer.clear();
            self->read();
        });
    }

    websocket::stream<beast::tcp_stream> m_stream;
    beast::flat_buffer m_buffer;
};

}  // namespace

class BareEchoServer::Impl {
public:
    Impl() {
        accept();
        m_thread = std::thread([this] { m_io.run(); });
    }

    ~Impl() {
        m_io.stop();
        m_thread.join();
    }

    std::uint16_t port() const { return m_acceptor.local_endpoint().port(); }

private:
    void accept() {
        m_acceptor.async_accept([this](error_code ec, tcp::socket socket) {
            if (ec) return;
            std::make_shared<EchoSession>(std::move(socket))->start();
            accept();
        });
    }

    asio::io_context m_io{1};
    tcp::acceptor m_acceptor{m_io, kAnyPort};
    std::thread m_thread;
};

BareEchoServer::BareEchoServer() : m_impl(std::make_unique<Impl>()) {}
BareEchoServer::~BareEchoServer() = default;

std::uint16_t BareEchoServer::port() const {
    return m_impl->port();
}

class BareBroadcaster::Impl {
public:
    Impl() {
        accept();
        m_thread = std::thread([this] { m_io.run(); });
    }

    ~Impl() {
        m_io.stop();
        m_thread.join();
    }

    std::uint16_t port() const { return m_acceptor.local_endpoint().port(); }

    void sendToAll(std::string message) {
        asio::post(m_io, [this, message = std::move(message)] {
            for (auto& client : m_clients)
                client.write(asio::buffer(message));
        });
    }

private:
    using Client = websocket::stream<tcp::socket>;

    // The handshake of one client after the other.
    void accept() {
        m_acceptor.async_accept([this](error_code ec, tcp::socket socket) {
            if (ec) return;
            socket.set_option(tcp::no_delay(true));
            m_clients.emplace_back(std::move(socket)).accept();
            m_clients.back().text(true);
            accept();
        });
    }

    asio::io_context m_io{1};
    tcp::acceptor m_acceptor{m_io, kAnyPort};
    std::list<Client> m_clients;
    std::thread m_thread;
};

BareBroadcaster::BareBroadcaster() : m_impl(std::make_unique<Impl>()) {}
BareBroadcaster::~BareBroadcaster() = default;

std::uint16_t BareBroadcaster::port() const {
    return m_impl->port();
}

void BareBroadcaster::sendToAll(std::string message) {
    m_impl->sendToAll(std::move(message));
}

}  // namespace vexa::bench

#include "unit/ipc/TestClient.h"

#include <sys/socket.h>
#include <sys/time.h>

#include <array>
#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/read.hpp>
#include <boost/asio/read_until.hpp>
#include <boost/asio/write.hpp>
#include <boost/beast/core/buffers_to_string.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/websocket.hpp>

#include "client/machine/TcpPorts.h"

namespace vexa::test {

namespace {

namespace asio = boost::asio;
namespace beast = boost::beast;
using asio::ip::tcp;
using boost::system::error_code;

void connect(tcp::socket& socket, std::int32_t port) {
    socket.connect({asio::ip::address_v4::loopback(), static_cast<std::uint16_t>(port)});
    socket.set_option(tcp::no_delay(true));
    const timeval limit{kPatience.count(), 0};
    for (const int option : {SO_RCVTIMEO, SO_SNDTIMEO})
        setsockopt(socket.native_handle(), SOL_SOCKET, option, &limit, sizeof limit);
}

}  // namespace

std::int32_t freePort() {
    static std::vector<client::ReservedPort> kept;
    return kept.emplace_back(client::TcpPorts({}).reserveFree()).port;
}

std::string handshakeRequest(const std::string& host, const std::string& more) {
    return "GET / HTTP/1.1\r\nHost: " + host +
           "\r\nUpgrade: websocket\r\nConnection: Upgrade\r\n"
           "Sec-WebSocket-Key: AAECAwQFBgcICQoLDA0ODw==\r\nSec-WebSocket-Version: 13\r\n" +
           more + "\r\n";
}

struct RawClient::Connection {
    asio::io_context io;
    tcp::socket socket{io};
};

RawClient::RawClient(std::int32_t port) : m_connection(std::make_unique<Connection>()) {
    connect(m_connection->socket, port);
}

RawClient::~RawClient() = default;
RawClient::RawClient(RawClient&&) noexcept = default;

bool RawClient::send(std::string_view bytes) {
    error_code ec;
    asio::write(m_connection->socket, asio::buffer(bytes), ec);
    return !ec;
}

std::string RawClient::receiveToEnd() {
    std::string all;
    std::array<char, 4096> part{};
    for (error_code ec; !ec;)
        all.append(part.data(), m_connection->socket.read_some(asio::buffer(part), ec));
    return all;
}

std::string RawClient::receive(std::size_t size) {
    std::string bytes(size, '\0');
    error_code ec;
    bytes.resize(asio::read(m_connection->socket, asio::buffer(bytes), ec));
    return bytes;
}

std::string RawClient::receiveHead() {
    std::string head;
    error_code ec;
    asio::read_until(m_connection->socket, asio::dynamic_buffer(head), "\r\n\r\n", ec);
    return head;
}

void RawClient::endSending() {
    m_connection->socket.shutdown(tcp::socket::shutdown_send);
}

struct TestClient::Connection {
    asio::io_context io;
    beast::websocket::stream<tcp::socket> stream{io};
    beast::flat_buffer buffer;
};

TestClient::TestClient(std::int32_t port) : m_connection(std::make_unique<Connection>()) {
    auto& stream = m_connection->stream;
    connect(stream.next_layer(), port);
    stream.handshake("localhost", "/");
    stream.read_message_max(std::size_t{16} << 20);
}

TestClient::~TestClient() = default;
TestClient::TestClient(TestClient&&) noexcept = default;

void TestClient::send(std::string_view message) {
    error_code gone;
    m_connection->stream.write(asio::buffer(message), gone);
}

std::optional<std::string> TestClient::receive() {
    error_code ec;
    m_connection->buffer.clear();
    m_connection->stream.read(m_connection->buffer, ec);
    if (ec) return std::nullopt;
    return beast::buffers_to_string(m_connection->buffer.data());
}

std::uint16_t TestClient::closeCode() const {
    return m_connection->stream.reason().code;
}

}  // namespace vexa::test

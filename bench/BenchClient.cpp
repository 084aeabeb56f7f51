#include "bench/BenchClient.h"

#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/write.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/websocket.hpp>
#include <string>

namespace vexa::bench {

namespace asio = boost::asio;
namespace beast = boost::beast;
using asio::ip::tcp;

struct BenchClient::Connection {
    asio::io_context io{1};
    beast::websocket::stream<tcp::socket> stream{io};
    beast::flat_buffer buffer;
};

BenchClient::BenchClient(std::uint16_t port) : m_connection(std::make_unique<Connection>()) {
    auto& stream = m_connection->stream;
    stream.next_layer().connect({asio::ip::address_v4::loopback(), port});
    stream.next_layer().set_option(tcp::no_delay(true));
    stream.handshake("127.0.0.1", "/");
    stream.text(true);
}

BenchClient::~BenchClient() = default;
BenchClient::BenchClient(BenchClient&&) noexcept = default;

void BenchClient::send(std::string_view message) {
    m_connection->stream.write(asio::buffer(message));
}

// A mask of zeros leaves the text as it is.
void BenchClient::sendTogether(std::string_view message, std::size_t count) {
    const char length = static_cast<char>(0x80 | message.size());
    const std::string frame = std::string{'\x81', length, 0, 0, 0, 0}.append(message);
    std::string all;
    for (std::size_t i = 0; i < count; ++i)
        all += frame;
    asio::write(m_connection->stream.next_layer(), asio::buffer(all));
}

std::size_t BenchClient::receive() {
    m_connection->buffer.clear();
    return m_connection->stream.read(m_connection->buffer);
}

}  // namespace vexa::bench

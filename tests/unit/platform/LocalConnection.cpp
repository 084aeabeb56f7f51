#include "unit/platform/LocalConnection.h"

#include <boost/asio/buffer.hpp>
#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/read.hpp>
#include <boost/asio/write.hpp>

namespace vexa::test {

using boost::asio::ip::tcp;

struct LocalConnection::State {
    boost::asio::io_context context;
    tcp::acceptor acceptor{context, tcp::endpoint(boost::asio::ip::address_v4::loopback(), 0)};
    tcp::socket client{context};
    tcp::socket server{context};
};

namespace {

// Wine tells the owner of a socket only once he has used it.
void passByte(tcp::socket& from, tcp::socket& to) {
    char byte = 'b';
    boost::asio::write(from, boost::asio::buffer(&byte, 1));
    boost::asio::read(to, boost::asio::buffer(&byte, 1));
}

}  // namespace

LocalConnection::LocalConnection() : m_state(std::make_unique<State>()) {
    m_state->client.connect(m_state->acceptor.local_endpoint());
    m_state->acceptor.accept(m_state->server);
    passByte(m_state->client, m_state->server);
    passByte(m_state->server, m_state->client);
}

LocalConnection::~LocalConnection() = default;

std::uint16_t LocalConnection::serverPort() const {
    return m_state->acceptor.local_endpoint().port();
}

std::uint16_t LocalConnection::clientPort() const {
    return m_state->client.local_endpoint().port();
}

}  // namespace vexa::test

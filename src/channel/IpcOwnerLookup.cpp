#include "channel/IpcOwnerLookup.h"

#include <boost/asio/post.hpp>
#include <cstddef>
#include <utility>

namespace vexa {

namespace asio = boost::asio;
using asio::ip::tcp;
using boost::system::error_code;

namespace {

// Ports that no connection has where it has just ended.
platform::PeerPorts portsOf(const tcp::socket& connection) {
    error_code ec;
    const tcp::endpoint peer = connection.remote_endpoint(ec);
    const tcp::endpoint local = ec ? tcp::endpoint() : connection.local_endpoint(ec);
    return ec ? platform::PeerPorts{} : platform::PeerPorts{peer.port(), local.port()};
}

}  // namespace

void IpcOwnerLookup::ask(const tcp::socket& connection, Answer answer) {
    m_connections.push_back(portsOf(connection));
    m_answers.push_back(std::move(answer));
    if (!std::exchange(m_isAsking, true)) asio::post(m_strand, [this] { askAll(); });
}

void IpcOwnerLookup::askAll() {
    m_isAsking = !m_answers.empty();
    if (!m_isAsking) return;
    asio::post(m_thread, [this, connections = std::exchange(m_connections, {}),
                          answers = std::exchange(m_answers, {})]() mutable {
        auto ours = platform::arePeersOfSameAccount(connections);
        asio::post(m_strand, [this, ours = std::move(ours), answers = std::move(answers)] {
            for (std::size_t i = 0; i < answers.size(); ++i)
                answers[i](ours[i]);
            askAll();
        });
    });
}

}  // namespace vexa

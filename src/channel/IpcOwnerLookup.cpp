#include "channel/IpcOwnerLookup.h"

#include <boost/asio/post.hpp>
#include <chrono>
#include <cstddef>
#include <thread>
#include <utility>

#include "text/OutOfMemory.h"

namespace vexa {

namespace asio = boost::asio;
using asio::ip::tcp;
using boost::system::error_code;

namespace {

constexpr std::chrono::milliseconds kLookupPause{100};

// Ports that no connection has where it has just ended.
platform::PeerPorts portsOf(const tcp::socket& connection) {
    error_code ec;
    const tcp::endpoint peer = connection.remote_endpoint(ec);
    const tcp::endpoint local = ec ? tcp::endpoint() : connection.local_endpoint(ec);
    return ec ? platform::PeerPorts{} : platform::PeerPorts{peer.port(), local.port()};
}

}  // namespace

void IpcOwnerLookup::ask(const tcp::socket& connection, Answer answer) {
    m_answers.reserve(m_answers.size() + 1);
    m_connections.push_back(portsOf(connection));
    m_answers.push_back(std::move(answer));
    if (!std::exchange(m_isAsking, true)) asio::post(m_strand, [this] { askAll(); });
}

void IpcOwnerLookup::forget() {
    m_connections.clear();
    m_answers.clear();
    m_isAsking = false;
}

void IpcOwnerLookup::askAll() {
    m_isAsking = !m_answers.empty();
    if (!m_isAsking) return;
    asio::post(m_thread, [this, connections = std::exchange(m_connections, {}),
                          answers = std::exchange(m_answers, {})] { answer(connections, answers); });
}

// On the thread of its own. Without memory it asks again: nobody gets in unasked.
void IpcOwnerLookup::answer(const std::vector<platform::PeerPorts>& connections,
                            const std::vector<Answer>& answers) {
    const auto ask = [&] {
        const auto ours = platform::arePeersOfSameAccount(connections);
        asio::post(m_strand, [this, ours, answers] {
            for (std::size_t i = 0; i < answers.size(); ++i)
                answers[i](ours[i]);
            askAll();
        });
    };
    while (!withinMemory(ask))
        std::this_thread::sleep_for(kLookupPause);
}

}  // namespace vexa

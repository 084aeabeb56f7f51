#include "channel/IpcEntrance.h"

#include <algorithm>
#include <boost/asio/post.hpp>
#include <iterator>
#include <type_traits>
#include <utility>

namespace vexa {

namespace asio = boost::asio;
using asio::ip::tcp;
using boost::system::error_code;

namespace {

constexpr std::size_t kMaxOutside = 16;

// What each of ours has for his request, however many press in.
constexpr std::chrono::milliseconds kGrace{100};

// How long a stranger has to take the answer.
constexpr std::chrono::milliseconds kStrangerQuiet{500};

constexpr std::chrono::milliseconds kAcceptPause{100};

// With POSIX sockets this gives a restarted server its port back while old connections linger, and no port
// that is listened on; with Windows' it would let two servers share one.
constexpr bool kMayReuseAddress = std::is_same_v<tcp::acceptor::native_handle_type, int>;

}  // namespace

IpcEntrance::IpcEntrance(const asio::any_io_executor& strand, IpcSession::Events& events,
                         std::function<void()> isEmpty)
    : m_strand(strand),
      m_events(events),
      m_isEmpty(std::move(isEmpty)),
      m_acceptor(strand),
      m_pause(strand) {}

bool IpcEntrance::open(std::int32_t port) {
    if (port < 1 || port > 65535) return false;
    const tcp::endpoint endpoint(asio::ip::address_v4::loopback(), static_cast<std::uint16_t>(port));
    error_code ec;
    m_acceptor.open(endpoint.protocol(), ec);
    if (kMayReuseAddress && !ec) m_acceptor.set_option(asio::socket_base::reuse_address(true), ec);
    if (!ec) m_acceptor.bind(endpoint, ec);
    if (!ec) m_acceptor.listen(asio::socket_base::max_listen_connections, ec);
    if (!ec) m_acceptor.non_blocking(true, ec);
    return !ec;
}

void IpcEntrance::accept() {
    if (std::exchange(m_isAccepting, true)) return;
    m_acceptor.async_accept(m_strand, [this](error_code ec, tcp::socket socket) {
        if (ec == asio::error::operation_aborted) return;
        m_isAccepting = false;
        if (!m_acceptor.is_open()) return;
        // Out of descriptors, most likely: try again when some client has gone.
        if (ec) return pause(kAcceptPause);
        receive(std::move(socket));
        acceptMore();
    });
}

// As many as there are places, so that the system can be asked once for all of them.
void IpcEntrance::acceptMore() {
    const auto ours = std::count_if(m_outside.begin(), m_outside.end(),
                                    [](const auto& entry) { return !entry.second.connection->isEnding(); });
    while (m_unjudged.size() + static_cast<std::size_t>(ours) < kMaxOutside) {
        error_code ec;
        tcp::socket socket = m_acceptor.accept(m_strand, ec);
        if (ec) break;
        receive(std::move(socket));
    }
}

void IpcEntrance::receive(tcp::socket socket) {
    const ClientId id = ++m_lastId;
    auto connection = std::make_shared<IpcConnection>(std::move(socket), [this, id] { ended(id); });
    m_owners.ask(connection->socket(), [this, id](bool isOurs) { judged(id, isOurs); });
    m_connections.emplace(id, std::move(connection));
    m_unjudged.insert(id);
}

void IpcEntrance::judged(ClientId id, bool isOurs) {
    if (m_unjudged.erase(id) == 0) return;  // nobody comes in any more
    const Arrival arrival{id, m_connections.at(id), Clock::now()};
    if (!isOurs) {
        turnAway(arrival);
    } else if (makeRoom()) {
        begin(arrival);
    } else {
        m_next = arrival;
    }
    if (m_unjudged.empty()) m_next ? letNextIn() : accept();
}

void IpcEntrance::begin(const Arrival& arrival) {
    m_outside.emplace(arrival.id, arrival);
    std::make_shared<IpcSession>(arrival.id, arrival.connection, m_owners, m_events)->start();
}

// In a crowd it costs next to nothing to turn one away: who is to get in waits behind all of them.
void IpcEntrance::turnAway(const Arrival& arrival) {
    if (m_outside.size() >= kMaxOutside) return arrival.connection->reset();
    m_outside.emplace(arrival.id, arrival);
    arrival.connection->refuse(kStrangerQuiet);
}

bool IpcEntrance::dropNewestRefused() {
    const auto newest = std::find_if(m_outside.rbegin(), m_outside.rend(),
                                     [](const auto& entry) { return entry.second.connection->isEnding(); });
    if (newest == m_outside.rend()) return false;
    const auto connection = newest->second.connection;
    connection->reset();
    return true;
}

bool IpcEntrance::makeRoom() {
    if (m_outside.size() < kMaxOutside || dropNewestRefused()) return true;
    const Arrival newest = m_outside.rbegin()->second;
    if (Clock::now() - newest.since < kGrace) return false;
    newest.connection->reset();
    return true;
}

void IpcEntrance::letNextIn() {
    if (!m_next) return;
    if (!makeRoom()) return pause(kGrace);
    begin(*std::exchange(m_next, std::nullopt));
    accept();
}

void IpcEntrance::pause(Clock::duration time) {
    m_pause.expires_after(time);
    m_pause.async_wait([this](error_code cancelled) {
        if (cancelled || !m_acceptor.is_open()) return;
        m_next ? letNextIn() : accept();
    });
}

void IpcEntrance::placeIsFree() {
    if (m_next) asio::post(m_strand, [this] { letNextIn(); });
}

void IpcEntrance::entered(ClientId id) {
    if (m_outside.erase(id) != 0) placeIsFree();
}

void IpcEntrance::ended(ClientId id) {
    const bool hadPlace = m_outside.erase(id) != 0;
    m_connections.erase(id);
    m_events.left(id);
    if (hadPlace) placeIsFree();
    if (m_connections.empty() && !m_acceptor.is_open()) m_isEmpty();
}

void IpcEntrance::close() {
    error_code ignored;
    m_acceptor.close(ignored);
    m_pause.cancel();
    if (m_next) m_outside.emplace(m_next->id, *std::exchange(m_next, std::nullopt));
    for (const ClientId id : std::exchange(m_unjudged, {})) {
        const auto connection = m_connections.at(id);
        connection->reset();
    }
    for (const auto& [id, arrival] : std::map(m_outside))
        arrival.connection->reset();
    if (m_connections.empty()) m_isEmpty();
}

void IpcEntrance::resetAll() {
    m_next.reset();
    m_unjudged.clear();
    while (!m_connections.empty())
        m_connections.extract(m_connections.begin()).mapped()->reset();
}

void IpcEntrance::acceptAnew() {
    error_code ignored;
    m_acceptor.cancel(ignored);
    m_pause.cancel();
    m_owners.forget();
    m_isAccepting = false;
    accept();
}

}  // namespace vexa

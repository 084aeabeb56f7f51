#pragma once

#include <boost/asio/any_io_executor.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/steady_timer.hpp>
#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <set>

#include "channel/IpcConnection.h"
#include "channel/IpcOwnerLookup.h"
#include "channel/IpcSession.h"

namespace vexa {

/// The port of a server and all its connections. Strangers are answered and sent away; of those who may get
/// in, a session begins. However many press in, few are kept that are not in yet, the newest go first, and
/// none of ours goes before it had time to say something. Touched on the strand alone.
class IpcEntrance {
public:
    using ClientId = IpcSession::ClientId;

    /// `isEmpty` is called when the last connection has ended after close().
    IpcEntrance(const boost::asio::any_io_executor& strand, IpcSession::Events& events,
                std::function<void()> isEmpty);

    /// False if `port` is not a free port from 1 to 65535.
    bool open(std::int32_t port);
    void accept();
    /// Nobody comes in any more, and who is not in goes.
    void close();
    bool isEmpty() const { return m_connections.empty(); }

    /// A session's client is in.
    void entered(ClientId id);

    void resetAll();
    /// Whatever has become of the last accept(). REQUIRES: all are reset.
    void acceptAnew();

private:
    using Clock = std::chrono::steady_clock;
    struct Arrival {
        ClientId id;
        std::shared_ptr<IpcConnection> connection;
        Clock::time_point since;
    };

    void acceptMore();
    void receive(boost::asio::ip::tcp::socket socket);
    void judged(ClientId id, bool isOurs);
    void begin(const Arrival& arrival);
    void turnAway(const Arrival& arrival);
    bool dropNewestRefused();
    bool makeRoom();
    void letNextIn();
    void pause(Clock::duration time);
    void placeIsFree();
    void ended(ClientId id);

    const boost::asio::any_io_executor m_strand;
    IpcSession::Events& m_events;
    const std::function<void()> m_isEmpty;
    boost::asio::ip::tcp::acceptor m_acceptor;
    boost::asio::steady_timer m_pause;
    ClientId m_lastId = 0;
    std::map<ClientId, std::shared_ptr<IpcConnection>> m_connections;
    std::set<ClientId> m_unjudged;  // it is asked whose they are; until then nobody is accepted
    std::map<ClientId, Arrival> m_outside;
    bool m_isAccepting = false;
    std::optional<Arrival> m_next;  // one of ours that waits for a place; until then nobody is accepted
    IpcOwnerLookup m_owners{m_strand};
};

}  // namespace vexa

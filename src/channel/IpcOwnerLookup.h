#pragma once

#include <boost/asio/any_io_executor.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/thread_pool.hpp>
#include <functional>
#include <vector>

#include "platform/PeerAccount.h"

namespace vexa {

/// Finds out whose the connections of a server are, on a thread of its own: where the system knows only all
/// sockets at once, that takes long. Questions that come together, or meanwhile, are asked at once. Touched
/// on the strand alone.
class IpcOwnerLookup {
public:
    /// Called on the strand; true: a process of our account has the peer's end of the connection.
    using Answer = std::function<void(bool isOurs)>;

    explicit IpcOwnerLookup(const boost::asio::any_io_executor& strand) : m_strand(strand) {}

    /// Never calls `answer` before it returns.
    void ask(const boost::asio::ip::tcp::socket& connection, Answer answer);
    /// Questions that have not been asked yet get no answer.
    void forget();

private:
    void askAll();
    void answer(const std::vector<platform::PeerPorts>& connections, const std::vector<Answer>& answers);

    const boost::asio::any_io_executor m_strand;
    std::vector<platform::PeerPorts> m_connections;
    std::vector<Answer> m_answers;
    bool m_isAsking = false;
    boost::asio::thread_pool m_thread{1};
};

}  // namespace vexa

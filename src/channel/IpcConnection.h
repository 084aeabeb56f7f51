#pragma once

#include <array>
#include <atomic>
#include <boost/asio/buffer.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/steady_timer.hpp>
#include <chrono>
#include <cstddef>
#include <deque>
#include <functional>
#include <memory>
#include <string>
#include <utility>

namespace vexa {

/// One connection of a server's port, from the accept to its end: what goes out, and how it ends. It always
/// ends with a reset, also where the process just dies: a server that says the last word in TCP has its port
/// taken for a minute by what is left of the connection. Touched on the strand of its socket alone.
class IpcConnection : public std::enable_shared_from_this<IpcConnection> {
public:
    using Bytes = std::shared_ptr<const std::string>;
    using Duration = std::chrono::milliseconds;

    /// `hasEnded` is called by the reset, once.
    IpcConnection(boost::asio::ip::tcp::socket socket, std::function<void()> hasEnded);
    ~IpcConnection();
    IpcConnection(const IpcConnection&) = delete;
    IpcConnection& operator=(const IpcConnection&) = delete;

    boost::asio::ip::tcp::socket& socket() { return m_socket; }

    /// Puts a frame behind all others, or in front of all that have not begun to go out, where it takes the
    /// place of one of its kind. They go out with the next write().
    void queue(Bytes frame);
    void queuePong(Bytes frame);
    /// Forgets all but what has begun to go out.
    void dropWaiting();

    /// Sends as much as the socket takes at once, and the rest as soon as it takes more.
    void write();
    /// Is called whenever the socket has taken a part of that rest.
    void whenWritten(std::function<void()> callback) { m_hasWritten = std::move(callback); }
    bool isAllWritten() const { return m_queue.empty(); }

    /// Whether several messages wait behind the one that goes out, of more than so many bytes.
    bool hasWaiting(std::size_t bytes) const;
    /// The bytes of all frames that have not gone out. Any thread.
    std::size_t unsent() const { return m_unsent; }

    /// Reads what still comes and forgets it, until the peer ends the connection or says nothing for `quiet`,
    /// at most for `limit`. REQUIRES: nobody else reads.
    void end(Duration quiet, Duration limit);
    /// Answers 403 and ends.
    void refuse(Duration quiet);
    bool isEnding() const { return m_rest != nullptr; }

    void resetAfter(Duration limit);
    void keep() { m_timer.cancel(); }
    void reset();

private:
    using Clock = std::chrono::steady_clock;

    std::size_t writeSome(boost::system::error_code& ec);
    void writeLater();
    void wrote(std::size_t size);
    void discard();
    void resetAt(Clock::time_point end);

    boost::asio::ip::tcp::socket m_socket;
    std::function<void()> m_hasEnded;
    std::function<void()> m_hasWritten;
    boost::asio::steady_timer m_timer;

    std::deque<Bytes> m_queue;
    std::size_t m_sentOfFirst = 0;
    bool m_isWriting = false;
    std::atomic<std::size_t> m_unsent{0};

    std::unique_ptr<std::array<char, 4096>> m_rest;
    Duration m_quiet{};
    Clock::time_point m_end;
};

}  // namespace vexa

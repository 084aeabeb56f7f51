#pragma once

#include <boost/system/error_code.hpp>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>

#include "channel/IpcConnection.h"
#include "channel/IpcOwnerLookup.h"

namespace vexa {

/// A connection of somebody who may get in: his request, then his messages. Touched on the strand of the
/// connection; it lives as long as an operation of it is under way.
class IpcSession : public std::enable_shared_from_this<IpcSession> {
public:
    using ClientId = std::uint64_t;
    using Bytes = IpcConnection::Bytes;

    /// What it tells its server.
    class Events {
    public:
        /// The answer that lets him in goes out: from now on he gets all that is sent.
        virtual void entered(std::shared_ptr<IpcSession> session) = 0;
        /// He ends it, or breaks the protocol: what is queued is still to be sent to him.
        virtual void leaves() = 0;
        /// From now on he gets nothing more, although his connection may still be there. Also for one who was
        /// never in, and more than once.
        virtual void left(ClientId client) = 0;
        virtual void received(std::shared_ptr<IpcSession> session, std::string message) = 0;
        /// Whether the next message is to be read before the last one has been handled.
        virtual bool isHandlerSlow() const = 0;

    protected:
        ~Events() = default;
    };

    /// The lookup must outlive it.
    IpcSession(ClientId id, std::shared_ptr<IpcConnection> connection, IpcOwnerLookup& owners,
               Events& events);
    ~IpcSession();
    IpcSession(const IpcSession&) = delete;
    IpcSession& operator=(const IpcSession&) = delete;

    ClientId id() const { return m_id; }

    void start();

    /// Takes a frame for the next flush(). One who leaves too much of them unread is dropped.
    void send(const Bytes& frame);
    void flush() { m_connection->write(); }

    /// Says goodbye: behind all that is queued, except to one who does not read.
    void close(std::uint16_t code);

    /// One of his messages has been handled.
    void messageHandled(std::size_t size);
    /// Reads on although one has not been.
    void readAhead();

private:
    class Layer;
    struct Protocol;

    void readRequest();
    void onRequest(boost::system::error_code ec);
    bool mayAsk() const;
    void onOwner(bool isOurs);
    void protocolWrites(std::string bytes);
    void read();
    void onMessage(boost::system::error_code ec);
    bool isBehind() const;
    void resume();
    void leave();
    void ended(boost::system::error_code ec);

    const ClientId m_id;
    const std::shared_ptr<IpcConnection> m_connection;
    IpcOwnerLookup& m_owners;
    Events& m_events;
    const std::unique_ptr<Protocol> m_protocol;
    bool m_isIn = false;
    bool m_isDropped = false;
    bool m_hasSaidGoodbye = false;
    bool m_isPaused = false;
    std::size_t m_unhandledMessages = 0;
    std::size_t m_unhandledBytes = 0;
};

}  // namespace vexa

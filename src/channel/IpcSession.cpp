#include "channel/IpcSession.h"

#include <boost/asio/async_result.hpp>
#include <boost/asio/post.hpp>
#include <boost/beast/core/bind_handler.hpp>
#include <boost/beast/core/buffers_to_string.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/http/empty_body.hpp>
#include <boost/beast/http/parser.hpp>
#include <boost/beast/http/read.hpp>
#include <boost/beast/websocket.hpp>
#include <chrono>
#include <optional>
#include <string_view>
#include <utility>

#include "channel/IpcEntry.h"
#include "channel/IpcFrame.h"
#include "channel/IpcLimits.h"

namespace vexa {

namespace asio = boost::asio;
namespace beast = boost::beast;
namespace http = beast::http;
namespace websocket = beast::websocket;
using asio::ip::tcp;
using boost::system::error_code;
using Duration = IpcConnection::Duration;

namespace {

constexpr std::chrono::seconds kHandshakeLimit{10};

// How long one who was dropped has to take the reason.
constexpr std::chrono::seconds kGoodbyeLimit{10};

// How long a connection stays that is none any more for WebSocket. Whoever has been refused or has ended it
// reads now, or never.
constexpr Duration kRefusedQuiet{50};
constexpr Duration kEndedQuiet{20};
constexpr Duration kBrokenQuiet{500};
constexpr Duration kEndLimit{2000};

// What one client may have waiting for the handler before his further messages stay in his socket.
constexpr std::size_t kMaxUnhandledMessages = 256;
constexpr std::size_t kMaxUnhandledBytes = kMaxIpcMessage;

// What a client may leave unread before his further commands have to wait: one that asks faster than he reads
// is slowed down, not dropped. What others cause to be sent to him still counts up to the limit.
constexpr std::size_t kMaxUnreadBytes = kMaxIpcQueued / 2;

constexpr std::size_t kMaxIdleBuffer = std::size_t{16} << 10;

}  // namespace

/// The socket as the WebSocket protocol sees it. What the protocol writes by itself, the answer to the
/// handshake and control frames, joins the rest of what goes out and never waits for it; how the connection
/// ends is not its business.
class IpcSession::Layer {
public:
    using executor_type = tcp::socket::executor_type;

    explicit Layer(IpcSession& session) : m_session(session) {}

    executor_type get_executor() { return m_session.m_connection->socket().get_executor(); }

    template <class Buffers, class Token>
    auto async_read_some(const Buffers& buffers, Token&& token) {
        return m_session.m_connection->socket().async_read_some(buffers, std::forward<Token>(token));
    }

    template <class Buffers, class Token>
    auto async_write_some(const Buffers& buffers, Token&& token) {
        return asio::async_initiate<Token, void(error_code, std::size_t)>(
            [](auto handler, Layer& layer, std::string bytes) {
                const std::size_t size = bytes.size();
                layer.m_session.protocolWrites(std::move(bytes));
                asio::post(layer.get_executor(),
                           beast::bind_front_handler(std::move(handler), error_code(), size));
            },
            token, std::ref(*this), beast::buffers_to_string(buffers));
    }

    template <class Handler>
    friend void async_teardown(beast::role_type /*role*/, Layer& layer, Handler&& handler) {
        asio::post(layer.get_executor(),
                   beast::bind_front_handler(std::forward<Handler>(handler), error_code()));
    }

    friend void beast_close_socket(Layer& layer) { layer.reset(); }

private:
    void reset() { m_session.m_connection->reset(); }

    IpcSession& m_session;
};

struct IpcSession::Protocol {
    explicit Protocol(IpcSession& session) : stream(session) {}

    websocket::stream<Layer, false> stream;
    beast::flat_buffer buffer;
    std::optional<http::request_parser<http::empty_body>> request;
};

IpcSession::IpcSession(ClientId id, std::shared_ptr<IpcConnection> connection, IpcOwnerLookup& owners,
                       Events& events)
    : m_id(id),
      m_connection(std::move(connection)),
      m_owners(owners),
      m_events(events),
      m_protocol(std::make_unique<Protocol>(*this)) {}

IpcSession::~IpcSession() = default;

void IpcSession::start() {
    error_code ignored;
    m_connection->socket().set_option(tcp::no_delay(true), ignored);
    m_connection->resetAfter(kHandshakeLimit);
    m_connection->whenWritten([weak = weak_from_this()] {
        if (const auto self = weak.lock()) self->readAhead();
    });
    readRequest();
}

void IpcSession::readRequest() {
    http::async_read_header(m_protocol->stream.next_layer(), m_protocol->buffer,
                            m_protocol->request.emplace(),
                            [self = shared_from_this()](error_code ec, std::size_t) { self->onRequest(ec); });
}

void IpcSession::onRequest(error_code ec) {
    if (ec == http::error::end_of_stream || ec == asio::error::operation_aborted)
        return m_connection->reset();
    if (ec || !mayAsk()) return m_connection->refuse(kRefusedQuiet);
    m_owners.ask(m_connection->socket(), [self = shared_from_this()](bool isOurs) { self->onOwner(isOurs); });
}

// A web page in a browser can reach a loopback port, but it can't hide its origin.
bool IpcSession::mayAsk() const {
    const auto& request = m_protocol->request->get();
    return request.count(http::field::host) == 1 && isLoopbackHost(request[http::field::host]) &&
           request.count(http::field::origin) == 0 && websocket::is_upgrade(request);
}

// A client has to wait for the answer before he says more, and still has to be there: what a process has sent
// and left behind has no owner.
void IpcSession::onOwner(bool isOurs) {
    if (!m_connection->socket().is_open()) return;
    error_code ec;
    const bool saysMore = m_protocol->buffer.size() != 0 || m_connection->socket().available(ec) != 0;
    if (!isOurs || saysMore || ec) return m_connection->refuse(kRefusedQuiet);
    m_protocol->stream.read_message_max(kMaxIpcMessage);
    m_protocol->stream.async_accept(m_protocol->request->get(),
                                    [self = shared_from_this()](error_code failed) {
                                        if (failed) return self->ended(failed);
                                        self->m_connection->keep();
                                        self->m_protocol->request.reset();
                                        self->m_protocol->buffer = {};
                                        self->read();
                                    });
}

// One who is let in misses nothing that is sent once he has the answer. Behind a goodbye nothing may follow.
void IpcSession::protocolWrites(std::string bytes) {
    const auto text = std::make_shared<const std::string>(std::move(bytes));
    if (isCloseFrame(*text)) m_events.leaves();
    if (m_hasSaidGoodbye) return;
    if (isPongFrame(*text)) {
        m_connection->queuePong(text);
    } else {
        if (isCloseFrame(*text)) {
            m_hasSaidGoodbye = true;
            m_connection->dropWaiting();
            leave();
        } else if (text->starts_with("HTTP/1.1 101")) {
            m_isIn = true;
            m_events.entered(shared_from_this());
        }
        m_connection->queue(text);
    }
    m_connection->write();
}

void IpcSession::read() {
    m_protocol->stream.async_read(
        m_protocol->buffer, [self = shared_from_this()](error_code ec, std::size_t) { self->onMessage(ec); });
}

void IpcSession::onMessage(error_code ec) {
    if (ec) return ended(ec);
    auto& buffer = m_protocol->buffer;
    std::string message = beast::buffers_to_string(buffer.data());
    buffer.clear();
    if (buffer.capacity() > kMaxIdleBuffer) buffer.shrink_to_fit();
    if (!m_isIn) return read();  // on the way to his answer to the goodbye
    m_unhandledMessages += 1;
    m_unhandledBytes += message.size();
    m_isPaused = true;
    m_events.received(shared_from_this(), std::move(message));
    if (m_events.isHandlerSlow()) readAhead();
}

bool IpcSession::isBehind() const {
    return m_unhandledMessages >= kMaxUnhandledMessages || m_unhandledBytes > kMaxUnhandledBytes ||
           m_connection->unsent() > kMaxUnreadBytes;
}

void IpcSession::resume() {
    if (std::exchange(m_isPaused, false)) read();
}

void IpcSession::readAhead() {
    if (!isBehind()) resume();
}

void IpcSession::messageHandled(std::size_t size) {
    m_unhandledMessages -= 1;
    m_unhandledBytes -= size;
    readAhead();
}

void IpcSession::send(const Bytes& frame) {
    m_connection->queue(frame);
    if (!m_connection->hasWaiting(kMaxIpcQueued)) return;
    flush();  // what came in one rush may well find room in his socket
    if (m_connection->hasWaiting(kMaxIpcQueued)) {
        m_connection->dropWaiting();
        close(websocket::close_code::policy_error);
    }
}

void IpcSession::close(std::uint16_t code) {
    if (!m_isIn) return;
    m_hasSaidGoodbye = m_isDropped = true;
    leave();
    m_connection->resetAfter(kGoodbyeLimit);
    m_connection->queue(std::make_shared<const std::string>(closeFrame(code)));
    m_connection->write();
    resume();
}

void IpcSession::leave() {
    if (std::exchange(m_isIn, false)) m_events.left(m_id);
}

// Who has answered our goodbye has read it; nobody else can be known to have read ours.
void IpcSession::ended(error_code ec) {
    m_events.leaves();
    leave();
    const bool isEndOfProtocol = ec.category() == error_code(websocket::error::closed).category();
    if (!isEndOfProtocol || (m_isDropped && m_connection->isAllWritten())) return m_connection->reset();
    const bool isByHim = ec == websocket::error::closed && m_connection->isAllWritten();
    m_connection->end(isByHim ? kEndedQuiet : kBrokenQuiet, kEndLimit);
}

}  // namespace vexa

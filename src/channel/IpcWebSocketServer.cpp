#include "channel/IpcWebSocketServer.h"

#include <algorithm>
#include <atomic>
#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/steady_timer.hpp>
#include <boost/asio/strand.hpp>
#include <boost/asio/write.hpp>
#include <boost/beast/core/buffers_to_string.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/core/tcp_stream.hpp>
#include <boost/beast/http/empty_body.hpp>
#include <boost/beast/http/parser.hpp>
#include <boost/beast/http/read.hpp>
#include <boost/beast/websocket.hpp>
#include <chrono>
#include <deque>
#include <map>
#include <mutex>
#include <optional>
#include <system_error>
#include <thread>
#include <type_traits>
#include <utility>
#include <vector>

#include "channel/IpcStandby.h"
#include "platform/PeerAccount.h"
#include "platform/Thread.h"

namespace vexa {

namespace {

namespace asio = boost::asio;
namespace beast = boost::beast;
namespace http = beast::http;
namespace websocket = beast::websocket;
using asio::ip::tcp;
using boost::system::error_code;
using Strand = asio::strand<asio::io_context::executor_type>;
using Text = std::shared_ptr<const std::string>;
using ClientId = IpcWebSocketServer::ClientId;

constexpr std::chrono::seconds kHandshakeLimit{10};
constexpr std::chrono::seconds kLinger{10};
constexpr std::chrono::seconds kRefusedLinger{2};
constexpr std::chrono::milliseconds kFarewellLimit{500};
constexpr std::chrono::milliseconds kAcceptPause{100};

// With POSIX sockets this gives a restarted server its port back while old connections linger, and no port
// that is listened on; with Windows' it would let two servers share one.
constexpr bool kMayReuseAddress = std::is_same_v<tcp::acceptor::native_handle_type, int>;

// What one client may have waiting for the handler before his further messages stay in his socket.
constexpr std::size_t kMaxUnhandledMessages = 256;
constexpr std::size_t kMaxUnhandledBytes = IpcWebSocketServer::kMaxMessage;

// What a client may leave unread before his further commands have to wait: one that asks faster than he reads
// is slowed down, not dropped. What others cause to be sent to him still counts up to the limit.
constexpr std::size_t kMaxUnreadBytes = IpcWebSocketServer::kMaxQueued / 2;

constexpr std::size_t kMaxIdleBuffer = std::size_t{16} << 10;

constexpr std::string_view kForbidden =
    "HTTP/1.1 403 Forbidden\r\nConnection: close\r\nContent-Length: 0\r\n\r\n";

bool isPortOrNothing(std::string_view text) {
    if (text.empty()) return true;
    return text.front() == ':' &&
           std::all_of(text.begin() + 1, text.end(), [](char c) { return c >= '0' && c <= '9'; });
}

// A name that merely begins like this machine's may lead anywhere: nothing but a port stands behind it.
bool isLoopbackHost(std::string_view host) {
    error_code ec;
    if (!host.empty() && host.front() == '[') {
        const std::size_t end = host.find(']');
        if (end == std::string_view::npos || !isPortOrNothing(host.substr(end + 1))) return false;
        const auto address = asio::ip::make_address_v6(std::string(host.substr(1, end - 1)), ec);
        return !ec && address.is_loopback();
    }
    const std::size_t end = std::min(host.find(':'), host.size());
    if (!isPortOrNothing(host.substr(end))) return false;
    const std::string name(host.substr(0, end));
    if (beast::iequals(name, "localhost")) return true;
    const auto address = asio::ip::make_address_v4(name, ec);
    return !ec && address.is_loopback();
}

// A web page in a browser can reach a loopback port, but it can't hide its origin.
bool mayEnter(const http::request<http::empty_body>& request) {
    return request.count(http::field::host) == 1 && isLoopbackHost(request[http::field::host]) &&
           request.count(http::field::origin) == 0 && websocket::is_upgrade(request);
}

}  // namespace

class IpcSession;

/// What the server and its clients share. Everything but the atomics and the outbox is touched on the strand
/// `inout` alone.
class IpcWebSocketServer::Impl {
public:
    explicit Impl(Handler handler) : m_handler(std::move(handler)) {}

    bool open(std::int32_t port);
    bool start();
    void stop();

    bool sendToAll(std::string message);
    void sendTo(ClientId client, std::string message);

    void clientEntered(ClientId id, std::shared_ptr<IpcSession> session);
    void clientLeft(ClientId id);
    void sessionEnded(ClientId id);
    void received(std::shared_ptr<IpcSession> session, ClientId id, std::string message);

    Strand& inout() { return m_inout; }

private:
    struct Outgoing {
        ClientId client;  // 0: everyone
        Text text;
    };

    void accept();
    void queue(Outgoing outgoing);
    void flushOutbox();
    void handle(IpcSession& session, ClientId id, const std::string& message);
    void sayFarewell();

    const Handler m_handler;
    asio::io_context m_io{2};
    Strand m_inout{asio::make_strand(m_io)};
    Strand m_dispatch{asio::make_strand(m_io)};
    asio::executor_work_guard<asio::io_context::executor_type> m_work{m_io.get_executor()};
    tcp::acceptor m_acceptor{m_inout};
    asio::steady_timer m_pause{m_inout};
    std::map<ClientId, std::shared_ptr<IpcSession>> m_sessions;
    std::map<ClientId, std::shared_ptr<IpcSession>> m_clients;
    ClientId m_nextClient = 1;
    bool m_isLeaving = false;

    std::atomic<std::size_t> m_clientCount{0};
    std::atomic<std::size_t> m_unhandled{0};
    std::atomic<bool> m_isStopped{false};
    std::mutex m_outboxMutex;
    std::vector<Outgoing> m_outbox;
    IpcStandby m_standby{m_io};
    std::thread m_thread;
};

/// One connection, from the accept to the end. Lives as long as an operation of it is under way.
class IpcSession : public std::enable_shared_from_this<IpcSession> {
public:
    IpcSession(tcp::socket socket, IpcWebSocketServer::Impl& server, ClientId id)
        : m_server(server), m_id(id), m_linger(server.inout()), m_stream(std::move(socket)) {}

    void start();
    void send(const Text& text);
    void close(websocket::close_code code);
    void leave();
    void messageHandled(std::size_t size);

private:
    tcp::socket& socket() { return beast::get_lowest_layer(m_stream).socket(); }
    bool isSameAccount();
    void readRequest();
    void onRequest(error_code ec);
    void refuse();
    void discardRest();
    void enter();
    void read();
    void onMessage(error_code ec);
    bool isBehind() const;
    void resume();
    void writeNext();
    void onWritten(error_code ec);
    void sendClose();
    void limitLife(std::chrono::seconds limit);

    IpcWebSocketServer::Impl& m_server;
    const ClientId m_id;
    asio::steady_timer m_linger;
    websocket::stream<beast::tcp_stream, false> m_stream;
    beast::flat_buffer m_buffer;
    std::optional<http::request_parser<http::empty_body>> m_request;
    std::deque<Text> m_queue;
    std::atomic<std::size_t> m_queuedBytes{0};
    bool m_isOpen = false;
    bool m_isWriting = false;
    std::atomic<bool> m_isPaused{false};
    websocket::close_code m_closeCode = websocket::close_code::none;
    std::atomic<std::size_t> m_unhandledMessages{0};
    std::atomic<std::size_t> m_unhandledBytes{0};
};

// ---- the server

bool IpcWebSocketServer::Impl::open(std::int32_t port) {
    if (port < 1 || port > 65535) return false;
    const tcp::endpoint endpoint(asio::ip::address_v4::loopback(), static_cast<std::uint16_t>(port));
    error_code ec;
    m_acceptor.open(endpoint.protocol(), ec);
    if (kMayReuseAddress && !ec) m_acceptor.set_option(asio::socket_base::reuse_address(true), ec);
    if (!ec) m_acceptor.bind(endpoint, ec);
    if (!ec) m_acceptor.listen(asio::socket_base::max_listen_connections, ec);
    return !ec;
}

bool IpcWebSocketServer::Impl::start() {
    asio::post(m_inout, [this] { accept(); });
    try {
        m_standby.start();
        m_thread = std::thread([this] { m_io.run(); });
        return true;
    } catch (const std::system_error&) {
        stop();
        return false;
    }
}

void IpcWebSocketServer::Impl::accept() {
    m_acceptor.async_accept(m_inout, [this](error_code ec, tcp::socket socket) {
        if (m_isLeaving) return;
        if (ec) {
            // Out of descriptors, most likely: try again when some client has gone.
            m_pause.expires_after(kAcceptPause);
            m_pause.async_wait([this](error_code cancelled) {
                if (!cancelled) accept();
            });
            return;
        }
        const ClientId id = m_nextClient++;
        const auto session = std::make_shared<IpcSession>(std::move(socket), *this, id);
        m_sessions.emplace(id, session);
        session->start();
        accept();
    });
}

void IpcWebSocketServer::Impl::clientEntered(ClientId id, std::shared_ptr<IpcSession> session) {
    m_clients.emplace(id, std::move(session));
    m_clientCount = m_clients.size();
}

void IpcWebSocketServer::Impl::clientLeft(ClientId id) {
    m_clients.erase(id);
    m_clientCount = m_clients.size();
}

void IpcWebSocketServer::Impl::sessionEnded(ClientId id) {
    m_sessions.erase(id);
    if (m_isLeaving && m_sessions.empty()) m_io.stop();
}

bool IpcWebSocketServer::Impl::sendToAll(std::string message) {
    if (m_clientCount == 0 || m_isStopped) return false;
    queue({0, std::make_shared<const std::string>(std::move(message))});
    return true;
}

void IpcWebSocketServer::Impl::sendTo(ClientId client, std::string message) {
    queue({client, std::make_shared<const std::string>(std::move(message))});
}

// Posted, not deferred: the standby may have to write while the handler that sends is slow.
void IpcWebSocketServer::Impl::queue(Outgoing outgoing) {
    {
        const std::lock_guard lock(m_outboxMutex);
        m_outbox.push_back(std::move(outgoing));
        if (m_outbox.size() > 1) return;
    }
    asio::post(m_inout, [this] { flushOutbox(); });
}

void IpcWebSocketServer::Impl::flushOutbox() {
    std::vector<Outgoing> outgoing;
    {
        const std::lock_guard lock(m_outboxMutex);
        outgoing.swap(m_outbox);
    }
    for (const auto& [client, text] : outgoing) {
        if (client != 0) {
            const auto found = m_clients.find(client);
            if (found != m_clients.end()) std::shared_ptr(found->second)->send(text);
            continue;
        }
        // A send may drop its client from the map.
        for (auto next = m_clients.begin(); next != m_clients.end();)
            std::shared_ptr((next++)->second)->send(text);
    }
}

// The clock of a simulated machine must not run past a message that nobody has handled yet; the whole backlog
// counts as one piece of work, which a handler may interrupt by waiting.
void IpcWebSocketServer::Impl::received(std::shared_ptr<IpcSession> session, ClientId id,
                                        std::string message) {
    if (m_unhandled++ == 0) platform::beginForeignWork();
    asio::defer(m_dispatch, [this, session = std::move(session), id, message = std::move(message)] {
        handle(*session, id, message);
    });
}

void IpcWebSocketServer::Impl::handle(IpcSession& session, ClientId id, const std::string& message) {
    m_standby.callBegins();
    if (!m_isStopped) m_handler(id, message);
    m_standby.callEnds();
    session.messageHandled(message.size());
    if (--m_unhandled == 0) platform::endForeignWork();
}

void IpcWebSocketServer::Impl::sayFarewell() {
    m_isLeaving = true;
    error_code ignored;
    m_acceptor.close(ignored);
    m_pause.cancel();
    if (m_sessions.empty()) return m_io.stop();
    for (const auto& [id, session] : std::map(m_sessions))
        m_clients.contains(id) ? session->close(websocket::close_code::going_away) : session->leave();
    m_pause.expires_after(kFarewellLimit);
    m_pause.async_wait([this](error_code) { m_io.stop(); });
}

// A handler that runs now is waited for by the join; messages that still wait for it are dropped.
void IpcWebSocketServer::Impl::stop() {
    if (m_isStopped.exchange(true)) return;
    asio::post(m_inout, [this] {
        flushOutbox();
        sayFarewell();
    });
    {
        const platform::ForeignWait waiting;
        if (m_thread.joinable()) m_thread.join();
        m_standby.stop();
    }
    if (m_unhandled != 0) platform::endForeignWork();
    for (const auto& [id, session] : std::map(m_sessions))
        session->leave();
}

// ---- a session

void IpcSession::start() {
    error_code ignored;
    socket().set_option(tcp::no_delay(true), ignored);
    if (isSameAccount())
        readRequest();
    else
        refuse();
}

bool IpcSession::isSameAccount() {
    error_code ec;
    const tcp::endpoint peer = socket().remote_endpoint(ec);
    if (ec) return false;
    const tcp::endpoint local = socket().local_endpoint(ec);
    return !ec && platform::isPeerOfSameAccount(peer.port(), local.port());
}

void IpcSession::readRequest() {
    beast::get_lowest_layer(m_stream).expires_after(kHandshakeLimit);
    http::async_read_header(m_stream.next_layer(), m_buffer, m_request.emplace(),
                            [self = shared_from_this()](error_code ec, std::size_t) { self->onRequest(ec); });
}

void IpcSession::onRequest(error_code ec) {
    if (ec == http::error::end_of_stream || ec == beast::error::timeout ||
        ec == asio::error::operation_aborted)
        return leave();
    // A client has to wait for the answer before he says more.
    if (ec || m_buffer.size() != 0 || !mayEnter(m_request->get())) return refuse();
    beast::get_lowest_layer(m_stream).expires_never();
    websocket::stream_base::timeout limits{};
    limits.handshake_timeout = kHandshakeLimit;
    limits.idle_timeout = websocket::stream_base::none();
    limits.keep_alive_pings = false;
    m_stream.set_option(limits);
    m_stream.read_message_max(IpcWebSocketServer::kMaxMessage);
    m_stream.auto_fragment(false);
    m_stream.text(true);
    // From here on, so that a client who has the answer misses nothing that is sent.
    m_isOpen = true;
    m_isWriting = true;
    m_server.clientEntered(m_id, shared_from_this());
    m_stream.async_accept(m_request->get(), [self = shared_from_this()](error_code failed) {
        failed ? self->leave() : self->enter();
    });
}

void IpcSession::refuse() {
    limitLife(kRefusedLinger);
    asio::async_write(socket(), asio::buffer(kForbidden),
                      [self = shared_from_this()](error_code ec, std::size_t) {
                          if (ec) return self->leave();
                          error_code ignored;
                          self->socket().shutdown(tcp::socket::shutdown_send, ignored);
                          self->m_buffer.clear();
                          self->discardRest();
                      });
}

// Closing with bytes unread would reset the connection and could take the answer with it.
void IpcSession::discardRest() {
    socket().async_read_some(m_buffer.prepare(4096), [self = shared_from_this()](error_code ec, std::size_t) {
        if (ec) return self->leave();
        self->discardRest();
    });
}

void IpcSession::enter() {
    m_request.reset();
    m_buffer = {};
    read();
    writeNext();
}

void IpcSession::read() {
    m_stream.async_read(m_buffer,
                        [self = shared_from_this()](error_code ec, std::size_t) { self->onMessage(ec); });
}

void IpcSession::onMessage(error_code ec) {
    if (ec) return leave();
    std::string message = beast::buffers_to_string(m_buffer.data());
    m_buffer.clear();
    if (m_buffer.capacity() > kMaxIdleBuffer) m_buffer.shrink_to_fit();
    m_unhandledMessages += 1;
    m_unhandledBytes += message.size();
    m_server.received(shared_from_this(), m_id, std::move(message));
    m_isPaused = true;
    if (!isBehind()) resume();
}

bool IpcSession::isBehind() const {
    return m_unhandledMessages >= kMaxUnhandledMessages || m_unhandledBytes > kMaxUnhandledBytes ||
           m_queuedBytes > kMaxUnreadBytes;
}

void IpcSession::resume() {
    if (m_isPaused.exchange(false)) read();
}

// On the handler's thread. The reader marks himself as paused before he looks at the counts, which are taken
// down here before the mark is looked at: one of the two sees the other.
void IpcSession::messageHandled(std::size_t size) {
    m_unhandledMessages -= 1;
    m_unhandledBytes -= size;
    if (!m_isPaused || isBehind()) return;
    asio::post(m_server.inout(), [self = shared_from_this()] { self->resume(); });
}

void IpcSession::send(const Text& text) {
    if (!m_isOpen) return;
    m_queue.push_back(text);
    m_queuedBytes += text->size();
    if (m_queuedBytes > IpcWebSocketServer::kMaxQueued) return close(websocket::close_code::policy_error);
    if (!m_isWriting) writeNext();
}

void IpcSession::writeNext() {
    m_isWriting = !m_queue.empty();
    if (!m_isWriting) {
        if (m_closeCode != websocket::close_code::none) sendClose();
        return;
    }
    m_stream.async_write(asio::buffer(*m_queue.front()),
                         [self = shared_from_this()](error_code ec, std::size_t) { self->onWritten(ec); });
}

void IpcSession::onWritten(error_code ec) {
    if (ec) return leave();
    m_queuedBytes -= m_queue.front()->size();
    m_queue.pop_front();
    if (m_isPaused && !isBehind()) resume();
    writeNext();
}

// The message that is half out must end before the close frame can follow. At the end of the service all that
// is queued still goes out; a client that does not read gets no more than what he has.
void IpcSession::close(websocket::close_code code) {
    if (!std::exchange(m_isOpen, false)) return;
    m_closeCode = code;
    m_server.clientLeft(m_id);
    limitLife(kLinger);
    if (!m_isWriting) return sendClose();
    if (code == websocket::close_code::policy_error) m_queue.resize(1);
}

void IpcSession::sendClose() {
    m_stream.async_close(m_closeCode, [self = shared_from_this()](error_code) { self->leave(); });
}

void IpcSession::limitLife(std::chrono::seconds limit) {
    m_linger.expires_after(limit);
    m_linger.async_wait([weak = weak_from_this()](error_code cancelled) {
        const auto self = weak.lock();
        if (self && !cancelled) self->leave();
    });
}

void IpcSession::leave() {
    if (std::exchange(m_isOpen, false)) m_server.clientLeft(m_id);
    m_linger.cancel();
    error_code ignored;
    socket().close(ignored);  // ends what is still under way
    m_server.sessionEnded(m_id);
}

// ---- the public face

std::shared_ptr<IpcWebSocketServer> IpcWebSocketServer::create(std::int32_t port, Handler handler) {
    try {
        auto impl = std::make_unique<Impl>(std::move(handler));
        if (!impl->open(port) || !impl->start()) return nullptr;
        return std::make_shared<IpcWebSocketServer>(std::move(impl));
    } catch (const boost::system::system_error&) {
        return nullptr;  // no descriptors left for the poll itself
    }
}

IpcWebSocketServer::IpcWebSocketServer(std::unique_ptr<Impl> impl) : m_impl(std::move(impl)) {}

IpcWebSocketServer::~IpcWebSocketServer() {
    stop();
}

void IpcWebSocketServer::stop() {
    m_impl->stop();
}

bool IpcWebSocketServer::sendToAll(std::string message) {
    return m_impl->sendToAll(std::move(message));
}

void IpcWebSocketServer::sendTo(ClientId client, std::string message) {
    m_impl->sendTo(client, std::move(message));
}

}  // namespace vexa

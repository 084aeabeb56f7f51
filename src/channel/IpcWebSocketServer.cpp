#include "channel/IpcWebSocketServer.h"

#include <atomic>
#include <boost/asio/defer.hpp>
#include <boost/asio/dispatch.hpp>
#include <boost/asio/executor_work_guard.hpp>
#include <boost/asio/io_context.hpp>
#include <boost/asio/post.hpp>
#include <boost/asio/steady_timer.hpp>
#include <boost/asio/strand.hpp>
#include <boost/system/system_error.hpp>
#include <chrono>
#include <deque>
#include <map>
#include <mutex>
#include <string>
#include <system_error>
#include <thread>
#include <utility>
#include <vector>

#include "channel/IpcEntrance.h"
#include "channel/IpcFrame.h"
#include "channel/IpcSession.h"
#include "channel/IpcStandby.h"
#include "platform/Thread.h"
#include "text/OutOfMemory.h"

namespace vexa {

namespace {

namespace asio = boost::asio;
using boost::system::error_code;
using Strand = asio::strand<asio::io_context::executor_type>;
using Bytes = IpcSession::Bytes;
using ClientId = IpcWebSocketServer::ClientId;

constexpr std::uint16_t kGoingAway = 1001;
constexpr std::chrono::milliseconds kFarewellLimit{500};
constexpr std::chrono::milliseconds kBeginningPause{10};

// What is queued in a rush of messages is gathered for so long, and so much of it: one write for many
// answers.
constexpr std::chrono::milliseconds kGatheringTime{1};
constexpr std::size_t kMostGathered = std::size_t{64} << 10;

}  // namespace

/// What the server and its clients share. All but the atomics, the outbox and the inbox is touched on the
/// strand `inout` alone.
class IpcWebSocketServer::Impl final : IpcSession::Events {
public:
    explicit Impl(Handler handler) : m_handler(std::move(handler)) {}

    bool open(std::int32_t port) { return m_entrance.open(port); }
    bool start();
    void stop();

    bool hasClients() const { return m_clientCount != 0 && !m_isStopped; }
    /// To one client, or to all of them if `client` is 0.
    void queue(ClientId client, std::string_view message);

private:
    struct Outgoing {
        ClientId client;
        Bytes frame;
    };
    struct Incoming {
        std::shared_ptr<IpcSession> session;
        std::string message;
    };
    struct Handled {
        std::shared_ptr<IpcSession> session;
        std::size_t size;
        bool isLast;
    };

    void entered(std::shared_ptr<IpcSession> session) override;
    void leaves() override { flushOutbox(); }
    void left(ClientId client) override;
    void received(std::shared_ptr<IpcSession> session, std::string message) override;
    bool isHandlerSlow() const override { return m_standby.isHelping(); }

    void run();
    void beginAnew();
    void flushOutbox();
    void flushUnlessGathering();
    void lookForRush();
    void dispatch();
    void passOn(const Handled& handled);
    Handled handleFirst();
    void handle(const Incoming& incoming);
    void helpSlowHandler();
    void sayFarewell();

    const Handler m_handler;
    asio::io_context m_io{2};
    Strand m_inout{asio::make_strand(m_io)};
    asio::executor_work_guard<asio::io_context::executor_type> m_work{m_io.get_executor()};
    asio::steady_timer m_farewell{m_inout};
    IpcEntrance m_entrance{m_inout, *this, [this] { m_io.stop(); }};
    std::map<ClientId, std::shared_ptr<IpcSession>> m_clients;
    bool m_isRush = false;  // a message waited when another had been handled

    std::atomic<std::size_t> m_clientCount{0};
    std::atomic<bool> m_isStopped{false};
    std::mutex m_outboxMutex;
    std::vector<Outgoing> m_outbox;
    std::size_t m_outboxBytes = 0;
    std::chrono::steady_clock::time_point m_outboxSince;  // when the first of it came
    bool m_isFlushPosted = false;
    std::mutex m_inboxMutex;
    std::deque<Incoming> m_inbox;  // in front the message that is being handled
    IpcStandby m_standby{m_io, [this] { helpSlowHandler(); }, [this] { beginAnew(); }};
    std::atomic<std::thread::id> m_handlerThread;
    std::thread m_thread;
};

bool IpcWebSocketServer::Impl::start() {
    asio::post(m_inout, [this] { m_entrance.accept(); });
    try {
        m_standby.start();
        m_thread = std::thread([this] { run(); });
        return true;
    } catch (const std::system_error&) {
        stop();
        return false;
    }
}

void IpcWebSocketServer::Impl::run() {
    while (!withinMemory([this] { m_io.run(); }))
        beginAnew();
}

// Where memory ran out, something of some client has ended half way: all are dropped, and may come back.
void IpcWebSocketServer::Impl::beginAnew() {
    const auto begin = [this] {
        m_entrance.resetAll();
        m_isStopped ? m_io.stop() : m_entrance.acceptAnew();
    };
    do
        std::this_thread::sleep_for(kBeginningPause);
    while (!withinMemory([&] { asio::post(m_inout, begin); }));
}

void IpcWebSocketServer::Impl::entered(std::shared_ptr<IpcSession> session) {
    m_entrance.entered(session->id());
    m_clients.emplace(session->id(), std::move(session));
    m_clientCount = m_clients.size();
}

void IpcWebSocketServer::Impl::left(ClientId client) {
    m_clients.erase(client);
    m_clientCount = m_clients.size();
}

// What a handler sends is written when it has returned, by its own thread, or by the standby once the handler
// is slow. Posted, not deferred: who sends may go on for long.
void IpcWebSocketServer::Impl::queue(ClientId client, std::string_view message) {
    Outgoing outgoing{client, std::make_shared<const std::string>(textFrame(message))};
    {
        const std::lock_guard lock(m_outboxMutex);
        if (m_outbox.empty()) m_outboxSince = std::chrono::steady_clock::now();
        m_outbox.push_back(std::move(outgoing));
        m_outboxBytes += m_outbox.back().frame->size();
        const bool isByHandler = m_handlerThread == std::this_thread::get_id() && !m_standby.isHelping();
        if (isByHandler || std::exchange(m_isFlushPosted, true)) return;
    }
    if (withinMemory([this] { asio::post(m_inout, [this] { flushOutbox(); }); })) return;
    const std::lock_guard lock(m_outboxMutex);
    m_isFlushPosted = false;  // it goes with the next message
}

void IpcWebSocketServer::Impl::flushOutbox() {
    std::vector<Outgoing> outgoing;
    {
        const std::lock_guard lock(m_outboxMutex);
        outgoing.swap(m_outbox);
        m_outboxBytes = 0;
        m_isFlushPosted = false;
    }
    if (outgoing.empty()) return;
    // Who does not read is dropped from the map meanwhile.
    for (auto next = m_clients.begin(); next != m_clients.end();) {
        const auto session = (next++)->second;
        for (const auto& [client, frame] : outgoing)
            if (client == 0 || client == session->id()) session->send(frame);
        session->flush();
    }
}

void IpcWebSocketServer::Impl::flushUnlessGathering() {
    bool isGathering = m_isRush;
    if (isGathering) {
        const std::lock_guard lock(m_outboxMutex);
        isGathering = m_outboxBytes < kMostGathered &&
                      std::chrono::steady_clock::now() - m_outboxSince < kGatheringTime;
    }
    if (!isGathering) flushOutbox();
}

// The client's next message has been read meanwhile, if it was there.
void IpcWebSocketServer::Impl::lookForRush() {
    {
        const std::lock_guard lock(m_inboxMutex);
        m_isRush = !m_inbox.empty();
    }
    flushUnlessGathering();
}

// The clock of a simulated machine must not run past a message that nobody has handled yet; the whole backlog
// counts as one piece of work, which a handler may interrupt by waiting.
void IpcWebSocketServer::Impl::received(std::shared_ptr<IpcSession> session, std::string message) {
    {
        const std::lock_guard lock(m_inboxMutex);
        m_inbox.push_back({std::move(session), std::move(message)});
        if (m_inbox.size() > 1) return;
    }
    platform::beginForeignWork();
    if (!withinMemory([this] { asio::defer(m_io, [this] { dispatch(); }); })) dispatch();
}

// Where memory doesn't allow to pass the next message on, it is handled here: the chain must not break.
void IpcWebSocketServer::Impl::dispatch() {
    for (bool isLast = false; !isLast;) {
        const Handled handled = handleFirst();
        isLast = handled.isLast;
        if (withinMemory([&] { asio::dispatch(m_inout, [this, handled] { passOn(handled); }); })) return;
        beginAnew();
    }
}

// What was queued for sending meanwhile, by whomever, is written before the client's next message is read; in
// a rush, when no further one waits.
void IpcWebSocketServer::Impl::passOn(const Handled& handled) {
    const bool isPassedOn = withinMemory([&] {
        flushUnlessGathering();
        handled.session->messageHandled(handled.size);
        asio::post(m_inout, [this] { lookForRush(); });
        if (!handled.isLast) asio::post(m_io, [this] { dispatch(); });
    });
    if (isPassedOn) return;
    beginAnew();
    if (!handled.isLast) dispatch();
}

IpcWebSocketServer::Impl::Handled IpcWebSocketServer::Impl::handleFirst() {
    std::unique_lock lock(m_inboxMutex);
    const Incoming& incoming = m_inbox.front();  // stays where it is when others come
    lock.unlock();
    handle(incoming);
    lock.lock();
    Incoming first = std::move(m_inbox.front());
    m_inbox.pop_front();
    const bool isLast = m_inbox.empty();
    lock.unlock();
    if (isLast) platform::endForeignWork();
    return {std::move(first.session), first.message.size(), isLast};
}

void IpcWebSocketServer::Impl::handle(const Incoming& incoming) {
    m_handlerThread = std::this_thread::get_id();
    m_standby.callBegins();
    const bool isHandled = withinMemory([&] {
        if (!m_isStopped) m_handler(incoming.session->id(), incoming.message);
    });
    m_standby.callEnds();
    m_handlerThread = std::thread::id();
    if (!isHandled) beginAnew();
}

void IpcWebSocketServer::Impl::helpSlowHandler() {
    asio::post(m_inout, [this] {
        flushOutbox();
        // Who reads his own goodbye leaves the map.
        for (auto next = m_clients.begin(); next != m_clients.end();) {
            const auto session = (next++)->second;
            session->readAhead();
        }
    });
}

void IpcWebSocketServer::Impl::sayFarewell() {
    m_entrance.close();
    for (const auto& [id, session] : std::map(m_clients))
        session->close(kGoingAway);
    m_farewell.expires_after(kFarewellLimit);
    m_farewell.async_wait([this](error_code) { m_io.stop(); });
}

// A handler that runs now is waited for by the join; messages that still wait for it are dropped.
void IpcWebSocketServer::Impl::stop() {
    if (m_isStopped.exchange(true)) return;
    const bool isFarewell = withinMemory([this] {
        asio::post(m_inout, [this] {
            flushOutbox();
            sayFarewell();
        });
    });
    if (!isFarewell) m_io.stop();
    {
        const platform::ForeignWait waiting;
        if (m_thread.joinable()) m_thread.join();
        m_standby.stop();
    }
    if (!m_inbox.empty()) platform::endForeignWork();
    m_entrance.resetAll();
}

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

bool IpcWebSocketServer::hasClients() const {
    return m_impl->hasClients();
}

bool IpcWebSocketServer::sendToAll(std::string_view message) {
    const bool isTaken = hasClients();
    if (isTaken) m_impl->queue(0, message);
    return isTaken;
}

void IpcWebSocketServer::sendTo(ClientId client, std::string_view message) {
    m_impl->queue(client, message);
}

}  // namespace vexa

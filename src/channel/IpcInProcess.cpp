#include "channel/IpcInProcess.h"

#include <algorithm>
#include <array>
#include <deque>
#include <map>
#include <utility>

#include "channel/Ipc.h"
#include "platform/Event.h"
#include "platform/Mutex.h"
#include "platform/Thread.h"
#include "text/OutOfMemory.h"

namespace vexa {

namespace {

using platform::Event;
using platform::LockGuard;
using platform::Mutex;
using platform::Reset;

/// One port: a queue of messages and the thread that hands them to the callback.
class Server {
public:
    Server(IpcReceiveCallback callback, void* context) : m_callback(callback), m_context(context) {
        m_dispatcher.start("dispatcher", [this] { dispatch(); });
    }

    void stop() {
        m_stop.set();
        m_dispatcher.join();
    }

    void receive(std::string message) {
        {
            const LockGuard lock(m_mutex);
            m_incoming.push_back(std::move(message));
        }
        m_arrived.set();
    }

    bool send(const std::string& message);
    void add(std::shared_ptr<InProcessClient::State> client) {
        const LockGuard lock(m_mutex);
        m_clients.push_back(std::move(client));
    }
    void remove(const std::shared_ptr<InProcessClient::State>& client) {
        const LockGuard lock(m_mutex);
        m_clients.erase(std::remove(m_clients.begin(), m_clients.end(), client), m_clients.end());
    }

private:
    bool takeNext(std::string& message) {
        const LockGuard lock(m_mutex);
        if (m_incoming.empty()) return false;
        message = std::move(m_incoming.front());
        m_incoming.pop_front();
        return true;
    }

    void dispatch() {
        const std::array<Event*, 2> events{&m_stop, &m_arrived};
        std::string message;
        while (waitForAny(events, platform::kForever) != 0)
            while (takeNext(message))
                m_callback(message.data(), static_cast<std::uint32_t>(message.size()), m_context);
    }

    const IpcReceiveCallback m_callback;
    void* const m_context;
    Mutex m_mutex{"a server's queue"};
    std::deque<std::string> m_incoming GUARDED_BY(m_mutex);
    std::vector<std::shared_ptr<InProcessClient::State>> m_clients GUARDED_BY(m_mutex);
    Event m_stop{Reset::Manual, "the stop of a server"};
    Event m_arrived{Reset::Auto, "a client's message"};
    platform::Thread m_dispatcher;
};

/// Servers by handle, and which of them has a port.
struct Servers {
    Mutex mutex{"the table of servers"};
    IpcHandle lastHandle GUARDED_BY(mutex) = 0;
    std::map<IpcHandle, std::shared_ptr<Server>> byHandle GUARDED_BY(mutex);
    std::map<std::int32_t, IpcHandle> byPort GUARDED_BY(mutex);
};

Servers& servers() {
    static Servers table;
    return table;
}

std::shared_ptr<Server> findServer(IpcHandle handle) {
    const LockGuard lock(servers().mutex);
    const auto found = servers().byHandle.find(handle);
    return found == servers().byHandle.end() ? nullptr : found->second;
}

}  // namespace

struct InProcessClient::State {
    std::shared_ptr<Server> server;
    Mutex mutex{"a client's mailbox"};
    std::vector<std::string> mailbox GUARDED_BY(mutex) = {};
};

namespace {

bool Server::send(const std::string& message) {
    const LockGuard lock(m_mutex);
    for (const auto& client : m_clients) {
        const LockGuard mailboxLock(client->mutex);
        client->mailbox.push_back(message);
    }
    return !m_clients.empty();
}

}  // namespace

std::unique_ptr<InProcessClient> InProcessClient::connect(std::int32_t port) {
    std::shared_ptr<Server> server;
    {
        const LockGuard lock(servers().mutex);
        const auto handle = servers().byPort.find(port);
        if (handle == servers().byPort.end()) return nullptr;
        server = servers().byHandle.at(handle->second);
    }
    auto state = std::make_shared<State>();
    state->server = server;
    server->add(state);
    return std::make_unique<InProcessClient>(std::move(state));
}

InProcessClient::InProcessClient(std::shared_ptr<State> state) : m_state(std::move(state)) {}

InProcessClient::~InProcessClient() {
    m_state->server->remove(m_state);
}

void InProcessClient::send(const std::string& message) {
    m_state->server->receive(message);
}

std::vector<std::string> InProcessClient::receive() {
    const LockGuard lock(m_state->mutex);
    return std::exchange(m_state->mailbox, {});
}

IpcHandle IpcCreateServer(std::int32_t /*kind*/, std::int32_t /*options*/, IpcReceiveCallback callback,
                          void* context, std::int32_t port) {
    if (port < 1 || port > 65535) return 0;
    const LockGuard lock(servers().mutex);
    const auto [entry, isFree] = servers().byPort.try_emplace(port, servers().lastHandle + 1);
    if (!isFree) return 0;
    servers().byHandle.emplace(++servers().lastHandle, std::make_shared<Server>(callback, context));
    return entry->second;
}

std::uint32_t IpcSend(IpcHandle handle, const void* bytes, std::uint32_t length) {
    bool isTaken = false;
    const bool isSent = withinMemory([&] {
        const auto server = findServer(handle);
        isTaken = server && server->send(std::string(static_cast<const char*>(bytes), length));
    });
    return isSent && isTaken ? 1 : 0;
}

void IpcClose(IpcHandle handle) {
    const auto server = findServer(handle);
    if (!server) return;
    {
        const LockGuard lock(servers().mutex);
        servers().byHandle.erase(handle);
        std::erase_if(servers().byPort, [handle](const auto& entry) { return entry.second == handle; });
    }
    server->stop();
}

}  // namespace vexa

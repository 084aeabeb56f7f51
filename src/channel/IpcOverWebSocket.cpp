#include <map>
#include <memory>
#include <string>
#include <string_view>

#include "channel/Ipc.h"
#include "channel/IpcWebSocketServer.h"
#include "platform/Mutex.h"
#include "text/NeverDestroyed.h"
#include "text/OutOfMemory.h"

namespace vexa {

namespace {

using platform::LockGuard;
using platform::Mutex;

/// Handles are not addresses: a closed one finds nothing, whoever still holds it.
class HandleTable {
public:
    IpcHandle add(std::shared_ptr<IpcWebSocketServer> server) {
        const LockGuard lock(m_mutex);
        m_servers.emplace(++m_lastHandle, std::move(server));
        return m_lastHandle;
    }

    std::shared_ptr<IpcWebSocketServer> find(IpcHandle handle) {
        const LockGuard lock(m_mutex);
        const auto found = m_servers.find(handle);
        return found == m_servers.end() ? nullptr : found->second;
    }

    std::shared_ptr<IpcWebSocketServer> take(IpcHandle handle) {
        const LockGuard lock(m_mutex);
        const auto node = m_servers.extract(handle);
        return node.empty() ? nullptr : node.mapped();
    }

private:
    Mutex m_mutex{"the table of servers"};
    IpcHandle m_lastHandle GUARDED_BY(m_mutex) = 0;
    std::map<IpcHandle, std::shared_ptr<IpcWebSocketServer>> m_servers GUARDED_BY(m_mutex);
};

HandleTable& handleTable() {
    static NeverDestroyed<HandleTable> table;
    return table.get();
}

}  // namespace

IpcHandle IpcCreateServer(std::int32_t /*kind*/, std::int32_t /*options*/, IpcReceiveCallback callback,
                          void* context, std::int32_t port) {
    auto server = IpcWebSocketServer::create(
        port, [callback, context](IpcWebSocketServer::ClientId, std::string_view message) {
            callback(message.data(), static_cast<std::uint32_t>(message.size()), context);
        });
    return server ? handleTable().add(std::move(server)) : 0;
}

std::uint32_t IpcSend(IpcHandle handle, const void* bytes, std::uint32_t length) {
    bool isTaken = false;
    const bool isQueued = withinMemory([&] {
        const auto server = handleTable().find(handle);
        isTaken = server && server->sendToAll({static_cast<const char*>(bytes), length});
    });
    return isQueued && isTaken ? 1 : 0;
}

void IpcClose(IpcHandle handle) {
    if (const auto server = handleTable().take(handle)) server->stop();
}

}  // namespace vexa

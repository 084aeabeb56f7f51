#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "channel/IpcWebSocketServer.h"
#include "client/record/ReplayedService.h"
#include "platform/Mutex.h"

namespace vexa::client {

/// Two ports that speak as those of the service in a recording did. Both answer on threads of their own.
class ReplayPorts {
public:
    /// Throws ClientError if a port can't be had.
    ReplayPorts(std::uint16_t spectral, std::uint16_t hotspot);
    ~ReplayPorts();
    ReplayPorts(const ReplayPorts&) = delete;
    ReplayPorts& operator=(const ReplayPorts&) = delete;

    /// Forgets everything, for a recording that begins anew with these events.
    void begin(const std::vector<RecordedEvent>& first);

    /// Tells an event of the recording to all clients of its port.
    void tell(const RecordedEvent& recorded);

    bool hasClients() const;

    /// The commands that would have changed something, since the last call.
    std::vector<std::string> takeRefused();

private:
    using Server = std::shared_ptr<IpcWebSocketServer>;

    Server open(RecordedPort port, std::uint16_t number);
    void receive(RecordedPort port, std::string_view message);
    const Server& serverOf(RecordedPort port) const {
        return port == RecordedPort::Spectral ? m_spectral : m_hotspot;
    }

    platform::Mutex m_mutex{"the replay"};
    ReplayedService m_service GUARDED_BY(m_mutex);
    std::vector<std::string> m_refused GUARDED_BY(m_mutex);
    bool m_isOpen GUARDED_BY(m_mutex) = false;  ///< Both servers are there.
    Server m_spectral;
    Server m_hotspot;
};

}  // namespace vexa::client

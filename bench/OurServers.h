#pragma once

#include <cstdint>
#include <string>

#include "channel/Ipc.h"
#include "hotspotport/SAHotSpotPortlink.h"

namespace vexa::bench {

/// A port on which nothing listens.
std::uint16_t freePort();

/// A server of channel/Ipc.h that answers each message with its own text.
class EchoServer {
public:
    EchoServer();
    ~EchoServer() { IpcClose(m_handle); }
    EchoServer(const EchoServer&) = delete;
    EchoServer& operator=(const EchoServer&) = delete;

    std::uint16_t port() const { return m_port; }
    void sendToAll(const std::string& message);

private:
    const std::uint16_t m_port = freePort();
    IpcHandle m_handle;
};

/// The hotspot port with all its work: the command is parsed and looked up, the answer built.
class HotspotServer {
public:
    HotspotServer();
    ~HotspotServer() { m_server.close(); }
    HotspotServer(const HotspotServer&) = delete;
    HotspotServer& operator=(const HotspotServer&) = delete;

    std::uint16_t port() const { return m_port; }

private:
    const std::uint16_t m_port = freePort();
    SAHotSpotPortlink m_server;
};

}  // namespace vexa::bench

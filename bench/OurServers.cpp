#include "bench/OurServers.h"

#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <stdexcept>

namespace vexa::bench {

namespace {

using boost::asio::ip::tcp;

void echo(const char* bytes, std::uint32_t length, void* context) {
    IpcSend(*static_cast<const IpcHandle*>(context), bytes, length);
}

IpcHandle serve(std::uint16_t port, IpcReceiveCallback callback, void* context) {
    const IpcHandle handle = IpcCreateServer(1, 0, callback, context, port);
    if (handle == 0) throw std::runtime_error("the port is taken");
    return handle;
}

}  // namespace

std::uint16_t freePort() {
    boost::asio::io_context io;
    const tcp::acceptor acceptor(io, {boost::asio::ip::address_v4::loopback(), 0});
    return acceptor.local_endpoint().port();
}

EchoServer::EchoServer() : m_handle(serve(m_port, &echo, &m_handle)) {}

void EchoServer::sendToAll(const std::string& message) {
    IpcSend(m_handle, message.data(), static_cast<std::uint32_t>(message.size()));
}

HotspotServer::HotspotServer() {
    m_server.m_hIpc = serve(m_port, &SAHotSpotPortlink::OnIpcMessage, &m_server);
}

}  // namespace vexa::bench

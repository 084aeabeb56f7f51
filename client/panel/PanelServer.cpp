#include "client/panel/PanelServer.h"

#include <array>
#include <chrono>
#include <type_traits>
#include <utility>

#include "client/terminal/ClientError.h"
#include "platform/PeerAccount.h"

namespace vexa::client {

namespace asio = boost::asio;
namespace beast = boost::beast;
using asio::ip::tcp;
using boost::system::error_code;

namespace {

constexpr std::size_t kMostSessions = 128;
constexpr std::chrono::milliseconds kShortagePause{100};

// On Windows it would let another process take the port as well.
constexpr bool kMayReuseAddress = std::is_same_v<tcp::acceptor::native_handle_type, int>;

tcp::acceptor listenOn(asio::io_context& context, std::uint16_t port) {
    tcp::acceptor acceptor(context, tcp::v4());
    error_code error;
    if (kMayReuseAddress) acceptor.set_option(asio::socket_base::reuse_address(true), error);
    acceptor.bind({asio::ip::address_v4::loopback(), port}, error);
    if (!error) acceptor.listen(asio::socket_base::max_listen_connections, error);
    if (error) throw ClientError("the port " + std::to_string(port) + " is not free");
    return acceptor;
}

// Another user of this computer may have seen the address, or a page of his may have been given the cookie.
bool isOfSameAccount(const tcp::socket& socket) {
    error_code error;
    const tcp::endpoint peer = socket.remote_endpoint(error);
    const tcp::endpoint local = error ? tcp::endpoint() : socket.local_endpoint(error);
    const std::array connection{platform::PeerPorts{peer.port(), local.port()}};
    return !error && platform::arePeersOfSameAccount(connection).front();
}

}  // namespace

PanelServer::PanelServer(asio::io_context& context, std::uint16_t port, const PanelRecordings& recordings,
                         Panel& panel)
    : m_acceptor(listenOn(context, port)),
      m_pause(context),
      m_door(m_acceptor.local_endpoint().port()),
      m_answers(m_door.host()),
      m_places{
          m_door, m_answers, recordings,
          [this, &panel](beast::tcp_stream stream, const PanelRequest& request) {
              std::make_shared<PanelPage>(std::move(stream), panel.pageEvents())->open(request, m_answers);
          }} {
    accept();
}

void PanelServer::accept() {
    m_acceptor.async_accept([this](error_code error, tcp::socket socket) {
        if (error == asio::error::operation_aborted) return;
        if (!error) {
            receive(std::move(socket));
            return accept();
        }
        m_pause.expires_after(kShortagePause);
        m_pause.async_wait([this](error_code cancelled) {
            if (!cancelled) accept();
        });
    });
}

void PanelServer::receive(tcp::socket socket) {
    if (!isOfSameAccount(socket)) return;
    makeRoom();
    const auto session = std::make_shared<PanelSession>(beast::tcp_stream(std::move(socket)), m_places);
    m_sessions.push_back(session);
    session->begin();
}

// In a crowd the oldest goes: it had the most time.
void PanelServer::makeRoom() {
    std::erase_if(m_sessions, [](const auto& session) { return session.expired(); });
    if (m_sessions.size() < kMostSessions) return;
    if (const auto oldest = m_sessions.front().lock()) oldest->drop();
}

void PanelServer::close() {
    m_acceptor.close();
    m_pause.cancel();
}

}  // namespace vexa::client

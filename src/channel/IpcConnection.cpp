#include "channel/IpcConnection.h"

#include <algorithm>
#include <string_view>

#include "channel/IpcFrame.h"

namespace vexa {

namespace asio = boost::asio;
using asio::ip::tcp;
using boost::system::error_code;

namespace {

// What one call of the system takes.
constexpr std::size_t kMostAtOnce = 16;

constexpr IpcConnection::Duration kRefusalLimit{500};

constexpr std::string_view kForbidden =
    "HTTP/1.1 403 Forbidden\r\nConnection: close\r\nContent-Length: 0\r\n\r\n";

}  // namespace

IpcConnection::IpcConnection(tcp::socket socket, std::function<void()> hasEnded)
    : m_socket(std::move(socket)), m_hasEnded(std::move(hasEnded)), m_timer(m_socket.get_executor()) {
    error_code ignored;
    m_socket.set_option(asio::socket_base::linger(true, 0), ignored);
    m_socket.non_blocking(true, ignored);
}

// The destructor of the socket itself would say goodbye.
IpcConnection::~IpcConnection() {
    error_code ignored;
    m_socket.close(ignored);
}

void IpcConnection::queue(Bytes frame) {
    m_unsent += frame->size();
    m_queue.push_back(std::move(frame));
}

// Whoever asks and asks, but does not read, gets the last answer.
void IpcConnection::queuePong(Bytes frame) {
    if (m_queue.size() > 1 && isPongFrame(*m_queue[1])) {
        m_unsent -= m_queue[1]->size();
        m_queue.erase(m_queue.begin() + 1);
    }
    m_unsent += frame->size();
    m_queue.insert(m_queue.begin() + (m_queue.empty() ? 0 : 1), std::move(frame));
}

void IpcConnection::dropWaiting() {
    const bool hasBegun = m_isWriting || m_sentOfFirst != 0;
    m_queue.resize(std::min(m_queue.size(), std::size_t{hasBegun ? 1U : 0U}));
    m_unsent = m_queue.empty() ? 0 : m_queue.front()->size();
}

bool IpcConnection::hasWaiting(std::size_t bytes) const {
    const std::size_t notMessages = m_queue.size() > 1 && isPongFrame(*m_queue[1]) ? 2 : 1;
    return m_queue.size() > notMessages + 1 && m_unsent - m_queue.front()->size() > bytes;
}

std::size_t IpcConnection::writeSome(error_code& ec) {
    std::array<asio::const_buffer, kMostAtOnce> frames;
    const std::size_t count = std::min(m_queue.size(), frames.size());
    for (std::size_t i = 0; i < count; ++i)
        frames[i] = asio::buffer(*m_queue[i]);
    frames[0] += m_sentOfFirst;
    return count == 1 ? m_socket.write_some(frames[0], ec) : m_socket.write_some(frames, ec);
}

void IpcConnection::wrote(std::size_t size) {
    m_sentOfFirst += size;
    while (!m_queue.empty() && m_sentOfFirst >= m_queue.front()->size()) {
        m_sentOfFirst -= m_queue.front()->size();
        m_unsent -= m_queue.front()->size();
        m_queue.pop_front();
    }
}

void IpcConnection::write() {
    while (!m_isWriting && !m_queue.empty()) {
        error_code ec;
        wrote(writeSome(ec));
        if (ec == asio::error::would_block || ec == asio::error::try_again) return writeLater();
        if (ec) return reset();
    }
}

void IpcConnection::writeLater() {
    m_isWriting = true;
    const Bytes first = m_queue.front();
    m_socket.async_write_some(asio::buffer(*first) + m_sentOfFirst,
                              [self = shared_from_this(), first](error_code ec, std::size_t size) {
                                  self->m_isWriting = false;
                                  if (ec) return self->reset();
                                  self->wrote(size);
                                  self->write();
                                  if (self->m_hasWritten) self->m_hasWritten();
                              });
}

void IpcConnection::refuse(Duration quiet) {
    queue(std::make_shared<const std::string>(kForbidden));
    write();
    end(quiet, kRefusalLimit);
}

void IpcConnection::end(Duration quiet, Duration limit) {
    if (!m_socket.is_open()) return;
    m_rest = std::make_unique<std::array<char, 4096>>();
    m_quiet = quiet;
    m_end = Clock::now() + limit;
    discard();
}

void IpcConnection::discard() {
    resetAt(std::min(m_end, Clock::now() + m_quiet));
    m_socket.async_read_some(asio::buffer(*m_rest), [self = shared_from_this()](error_code ec, std::size_t) {
        ec ? self->reset() : self->discard();
    });
}

void IpcConnection::resetAfter(Duration limit) {
    resetAt(Clock::now() + limit);
}

void IpcConnection::resetAt(Clock::time_point end) {
    m_timer.expires_at(end);
    m_timer.async_wait([weak = weak_from_this()](error_code cancelled) {
        const auto self = weak.lock();
        if (self && !cancelled && self->m_timer.expiry() <= Clock::now()) self->reset();
    });
}

// Whatever is still under way ends with it.
void IpcConnection::reset() {
    if (!m_socket.is_open()) return;
    const auto self = shared_from_this();
    error_code ignored;
    m_timer.cancel();
    m_socket.close(ignored);
    m_hasEnded();
}

}  // namespace vexa

#include "client/panel/web/PanelPage.h"

#include <boost/asio/ip/tcp.hpp>
#include <chrono>
#include <utility>

namespace vexa::client {

namespace asio = boost::asio;
namespace beast = boost::beast;
namespace http = beast::http;
namespace websocket = beast::websocket;
using asio::ip::tcp;
using beast::error_code;

namespace {

// What a page says is short. It gets a whole log at its start, and some lists.
constexpr std::size_t kMostFromPage = std::size_t{1} << 20;
constexpr std::size_t kMostForPage = std::size_t{8} << 20;

// A page that is in no window any more answers nothing.
constexpr websocket::stream_base::timeout kTimeouts{std::chrono::seconds(10), std::chrono::seconds(30), true};

}  // namespace

PanelPage::PanelPage(beast::tcp_stream stream, Events events)
    : m_events(std::move(events)), m_stream(std::move(stream)) {}

void PanelPage::open(const PanelRequest& request, const PanelAnswers& answers) {
    error_code ignored;
    beast::get_lowest_layer(m_stream).socket().set_option(tcp::no_delay(true), ignored);
    beast::get_lowest_layer(m_stream).expires_never();
    m_stream.set_option(kTimeouts);
    m_stream.set_option(websocket::stream_base::decorator([&answers](websocket::response_type& response) {
        answers.addHeaders(response);
        response.set(http::field::server, "vexa");  // else it tells of libraries
    }));
    m_stream.read_message_max(kMostFromPage);
    m_stream.text(true);
    m_stream.async_accept(request, [self = shared_from_this()](error_code error) {
        if (error) return;
        self->m_isOpen = true;
        self->m_events.entered(self);
        self->read();
    });
}

void PanelPage::read() {
    m_stream.async_read(m_buffer, [self = shared_from_this()](error_code error, std::size_t) {
        if (error) return self->leave();
        const auto bytes = self->m_buffer.cdata();
        if (self->m_isOpen) self->m_events.told({static_cast<const char*>(bytes.data()), bytes.size()});
        self->m_buffer.consume(self->m_buffer.size());
        self->read();
    });
}

void PanelPage::send(Text text) {
    if (!m_isOpen || m_isClosing) return;
    m_waitingBytes += text->size();
    m_waiting.push_back(std::move(text));
    if (m_waiting.size() == 1) return write();
    m_isTooSlow = m_waitingBytes - m_waiting.front()->size() > kMostForPage;
    if (m_isTooSlow) beast::get_lowest_layer(m_stream).close();
}

void PanelPage::write() {
    m_stream.async_write(asio::buffer(*m_waiting.front()),
                         [self = shared_from_this()](error_code error, std::size_t) {
                             if (error) return self->leave();
                             self->m_waitingBytes -= self->m_waiting.front()->size();
                             self->m_waiting.pop_front();
                             if (!self->m_waiting.empty()) return self->write();
                             if (self->m_isClosing) self->close();
                         });
}

// Behind what waits; whoever reads nothing is not waited for.
void PanelPage::close() {
    m_isClosing = true;
    if (!m_waiting.empty()) return;
    m_stream.async_close(websocket::close_code::going_away, [self = shared_from_this()](error_code) {});
}

void PanelPage::leave() {
    if (std::exchange(m_isOpen, false)) m_events.left(this, !m_isTooSlow);
}

}  // namespace vexa::client

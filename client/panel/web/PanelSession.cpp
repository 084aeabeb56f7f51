#include "client/panel/web/PanelSession.h"

#include <boost/asio/buffer.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/beast/http/read.hpp>
#include <boost/beast/websocket/rfc6455.hpp>
#include <chrono>
#include <utility>

#include "client/panel/web/PanelFiles.h"

namespace vexa::client {

namespace asio = boost::asio;
namespace beast = boost::beast;
namespace http = beast::http;
using asio::ip::tcp;
using beast::error_code;

namespace {

constexpr std::chrono::seconds kRequestLimit{10};
constexpr std::chrono::seconds kStepLimit{10};
constexpr std::chrono::seconds kGoodbyeLimit{1};
constexpr std::uint32_t kMostHead = 8192;

constexpr std::string_view kSocket = "/socket";
constexpr std::string_view kRecordings = "/recordings/";
constexpr std::string_view kNoEntry = "Open the address that `vexa panel` has printed; it lets in once.";

}  // namespace

PanelSession::PanelSession(beast::tcp_stream stream, PanelPlaces& places)
    : m_stream(std::move(stream)), m_places(places), m_buffer(kMostHead) {
    m_parser.header_limit(kMostHead);
}

void PanelSession::begin() {
    m_stream.expires_after(kRequestLimit);
    http::async_read_header(m_stream, m_buffer, m_parser,
                            [self = shared_from_this()](error_code error, std::size_t) {
                                error ? self->refuseUnread(error) : self->take();
                            });
}

void PanelSession::drop() {
    m_stream.close();
}

void PanelSession::refuseUnread(error_code error) {
    if (error.category() != http::make_error_code(http::error::end_of_stream).category()) return;
    if (error == http::error::end_of_stream || error == http::error::partial_message) return;
    if (error == http::error::header_limit || error == http::error::buffer_overflow)
        return answer(m_places.answers.refusal(http::status::request_header_fields_too_large, "Too long."));
    answer(m_places.answers.refusal(http::status::bad_request, "That is no request."));
}

void PanelSession::take() {
    const PanelRequest& request = m_parser.get();
    const PanelDoor& door = m_places.door;
    const bool isPage =
        m_parser.is_done() && request.target() == kSocket && beast::websocket::is_upgrade(request);
    if (isPage && door.isForUs(request) && door.hasCookie(request) && door.isFromOurPage(request))
        return m_places.enter(std::move(m_stream), request);
    answer(answerTo(request));
}

PanelAnswer PanelSession::answerTo(const PanelRequest& request) {
    const PanelAnswers& answers = m_places.answers;
    PanelDoor& door = m_places.door;
    if (!door.isForUs(request))
        return answers.refusal(http::status::forbidden, "This is for its own page alone.");
    const bool isKnown = door.hasCookie(request);
    if (PanelDoor::isEntry(request)) {
        if (door.letIn(request)) return answers.entrance(door.cookie());
        if (isKnown) return answers.entrance(std::nullopt);
    }
    if (!isKnown) return answers.refusal(http::status::forbidden, kNoEntry);
    if (request.method() != http::verb::get)
        return answers.refusal(http::status::method_not_allowed, "Nothing is changed by requests.");
    if (!m_parser.is_done()) return answers.refusal(http::status::bad_request, "No request here has a body.");
    const std::string_view target = request.target();
    if (target == kSocket) return answers.refusal(http::status::forbidden, "This is for its own page alone.");
    if (target.starts_with(kRecordings)) return recording(target.substr(kRecordings.size()));
    if (const auto file = panelFile(target)) return answers.file(file->type, file->content);
    return answers.refusal(http::status::not_found, "There is no such thing.");
}

PanelAnswer PanelSession::recording(std::string_view name) const {
    if (const auto path = m_places.recordings.find(name)) {
        if (auto found = m_places.answers.download(*path, std::string(name))) return std::move(*found);
    }
    return m_places.answers.refusal(http::status::not_found, "There is no such recording.");
}

void PanelSession::answer(PanelAnswer answer) {
    m_answer.emplace(std::move(answer));
    write();
}

// Each step has its own limit: a long file may take long, but not somebody who has stopped reading.
void PanelSession::write() {
    error_code error;
    if (m_answer->is_done()) return finish();
    const auto buffers = m_answer->prepare(error);
    if (error) return;
    m_stream.expires_after(kStepLimit);
    m_stream.async_write_some(buffers, [self = shared_from_this()](error_code failure, std::size_t size) {
        if (failure) return;
        self->m_answer->consume(size);
        self->write();
    });
}

// A connection that is closed with something unread in it is reset, and the answer may be lost with it.
void PanelSession::finish() {
    error_code ignored;
    m_stream.socket().shutdown(tcp::socket::shutdown_send, ignored);
    m_stream.expires_after(kGoodbyeLimit);
    discard();
}

void PanelSession::discard() {
    m_stream.async_read_some(asio::buffer(m_rest),
                             [self = shared_from_this()](error_code error, std::size_t) {
                                 if (!error) self->discard();
                             });
}

}  // namespace vexa::client

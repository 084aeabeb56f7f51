#pragma once

#include <array>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/core/tcp_stream.hpp>
#include <boost/beast/http/parser.hpp>
#include <functional>
#include <memory>
#include <optional>
#include <string_view>

#include "client/panel/web/PanelAnswers.h"
#include "client/panel/web/PanelDoor.h"
#include "client/panel/web/PanelRecordings.h"

namespace vexa::client {

/// What a request may lead to.
struct PanelPlaces {
    PanelDoor& door;
    const PanelAnswers& answers;
    const PanelRecordings& recordings;
    /// Takes a connection that becomes a page's.
    std::function<void(boost::beast::tcp_stream stream, const PanelRequest& request)> enter;
};

/// A connection from its first byte to the answer of its only request. Who takes long, or sends much, is not
/// waited for. What is under way keeps it alive.
class PanelSession : public std::enable_shared_from_this<PanelSession> {
public:
    PanelSession(boost::beast::tcp_stream stream, PanelPlaces& places);

    void begin();
    void drop();

private:
    void take();
    void refuseUnread(boost::beast::error_code error);
    PanelAnswer answerTo(const PanelRequest& request);
    PanelAnswer recording(std::string_view name) const;
    void answer(PanelAnswer answer);
    void write();
    void finish();
    void discard();

    boost::beast::tcp_stream m_stream;
    PanelPlaces& m_places;
    boost::beast::flat_buffer m_buffer;
    boost::beast::http::request_parser<boost::beast::http::empty_body> m_parser;
    std::optional<PanelAnswer> m_answer;
    std::array<char, 4096> m_rest{};
};

}  // namespace vexa::client

#pragma once

#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/core/tcp_stream.hpp>
#include <boost/beast/websocket/stream.hpp>
#include <cstddef>
#include <deque>
#include <functional>
#include <memory>
#include <string>
#include <string_view>

#include "client/panel/web/PanelAnswers.h"
#include "client/panel/web/PanelHttp.h"

namespace vexa::client {

/// The connection to a page that is open in a browser. One that reads too slowly is ended; it comes back by
/// itself. What is under way keeps it alive.
class PanelPage : public std::enable_shared_from_this<PanelPage> {
public:
    using Text = std::shared_ptr<const std::string>;

    struct Events {
        std::function<void(const std::shared_ptr<PanelPage>& page)> entered;
        std::function<void(std::string_view message)> told;
        /// Called once, if it has entered. `isClosed`: not for its slowness; else it is there still, and may
        /// come back when it reads again.
        std::function<void(const PanelPage* page, bool isClosed)> left;
    };

    PanelPage(boost::beast::tcp_stream stream, Events events);

    /// Answers the request by which the page becomes one.
    void open(const PanelRequest& request, const PanelAnswers& answers);

    void send(Text text);

    /// The panel ends.
    void close();

private:
    void read();
    void write();
    void leave();

    const Events m_events;
    boost::beast::websocket::stream<boost::beast::tcp_stream> m_stream;
    boost::beast::flat_buffer m_buffer;
    std::deque<Text> m_waiting;
    std::size_t m_waitingBytes = 0;
    bool m_isOpen = false;
    bool m_isClosing = false;
    bool m_isTooSlow = false;
};

}  // namespace vexa::client

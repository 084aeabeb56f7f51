#pragma once

#include <boost/asio/io_context.hpp>
#include <boost/asio/steady_timer.hpp>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <variant>

#include "client/panel/PanelLog.h"
#include "client/panel/PanelMessages.h"
#include "client/panel/PanelPasswords.h"
#include "client/panel/PanelRecorder.h"
#include "client/panel/PanelRelay.h"
#include "client/panel/web/PanelPage.h"
#include "client/terminal/Deadline.h"

namespace vexa::client {

/// What stands between the service and the pages: each page hears all that the service tells and how the
/// panel itself does, and what a page says goes to the service. Everything on the thread that runs the
/// context.
class Panel {
public:
    Panel(boost::asio::io_context& context, const PortOption& spectral, const PortOption& hotspot,
          const PanelRecordings& recordings);
    ~Panel();
    Panel(const Panel&) = delete;
    Panel& operator=(const Panel&) = delete;

    void begin();

    /// For a connection on which a page comes in.
    PanelPage::Events pageEvents();

    /// There has been a page, and for so long there has been none.
    bool isLeftFor(std::chrono::seconds time) const;

    /// Ends the recording and says goodbye to the pages, which takes the context a moment more.
    void end();

private:
    void enter(const std::shared_ptr<PanelPage>& page);
    void leave(const PanelPage* page, bool isClosed);
    void takeFromPage(std::string_view message);
    void takeFromService(RecordedPort port, const std::string& message);
    void serviceChanged(bool isRunning);
    void perform(PanelWish wish);
    void forward(PageCommand command);
    void startRecording();
    void stopRecording();
    template <class Work>
    void record(Work work);
    void send(const PageCommand& command);
    void ask(RecordedPort port, const char* question);
    void askForRecording();
    void stopScan();
    void keepSwitch(const Event& event);

    void tellAll(std::string text);
    void tellAll(const char* event, Json::Value members) { tellAll(panelMessage(event, std::move(members))); }
    void fail(const std::string& text);
    void tellNewsOfLog();
    void tellRecording();
    Json::Value recordings() const;
    Json::Value service() const;

    void tick();

    PanelRelay m_relay;
    const PanelRecordings& m_recordings;
    PanelRecorder m_recorder;
    PanelPasswords m_passwords;
    /// A page turns the hotspot switch; the service will tell that it has.
    bool m_isSwitchTurned = false;
    PanelLog m_log;
    std::set<std::shared_ptr<PanelPage>> m_pages;
    boost::asio::steady_timer m_tick;
    Deadline m_nextState = Deadline::never();
    Deadline m_nextScan = Deadline::never();
    std::optional<Deadline::Clock::time_point> m_leftSince;
};

}  // namespace vexa::client

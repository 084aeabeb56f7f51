#include "client/panel/Panel.h"

#include <algorithm>
#include <utility>

#include "client/hotspot/HotspotNarrator.h"
#include "client/hotspot/HotspotQuestions.h"
#include "client/machine/MachineRegistry.h"
#include "client/port/Event.h"
#include "client/port/JsonLine.h"
#include "client/terminal/ClientError.h"
#include "contract/Ports.h"

namespace vexa::client {

using std::chrono::milliseconds;

namespace {

constexpr milliseconds kTick{250};
constexpr milliseconds kBetweenStates{1000};

// Another client may have stopped the scan, and nothing tells of that. The service itself looks every 10 s
// whether one still runs.
constexpr milliseconds kScanPatience{12000};

}  // namespace

Panel::Panel(boost::asio::io_context& context, const PortOption& spectral, const PortOption& hotspot,
             const PanelRecordings& recordings)
    : m_relay(context, spectral, hotspot,
              {[this](bool isRunning) { serviceChanged(isRunning); },
               [this](RecordedPort port, const std::string& message) { takeFromService(port, message); }}),
      m_recordings(recordings),
      m_recorder(recordings),
      m_tick(context) {}

Panel::~Panel() = default;

void Panel::begin() {
    m_relay.open();
    tick();
}

void Panel::tick() {
    if (!m_pages.empty()) tellNewsOfLog();
    record([this] { m_recorder.flush(); });
    if (m_recorder.isActive() && m_nextState.isOver()) tellRecording();
    if (m_nextScan.isOver()) ask(RecordedPort::Spectral, contract::kFullScan);
    m_tick.expires_after(kTick);
    m_tick.async_wait([this](boost::system::error_code cancelled) {
        if (!cancelled) tick();
    });
}

PanelPage::Events Panel::pageEvents() {
    return {[this](const std::shared_ptr<PanelPage>& page) { enter(page); },
            [this](std::string_view message) { takeFromPage(message); },
            [this](const PanelPage* page, bool isClosed) { leave(page, isClosed); }};
}

void Panel::enter(const std::shared_ptr<PanelPage>& page) {
    tellNewsOfLog();
    m_leftSince.reset();
    m_pages.insert(page);
    const auto tell = [&](const char* event, Json::Value members) {
        page->send(std::make_shared<const std::string>(panelMessage(event, std::move(members))));
    };
    tell("service", service());
    tell("log", m_log.all());
    tell("recording", m_recorder.state());
    tell("recordings", recordings());
}

// Browsers let a page that nobody sees sleep: it is open nevertheless.
void Panel::leave(const PanelPage* page, bool isClosed) {
    std::erase_if(m_pages, [page](const auto& known) { return known.get() == page; });
    if (!m_pages.empty()) return;
    if (isClosed) m_leftSince = Deadline::Clock::now();
    if (!m_recorder.isActive()) stopScan();
}

bool Panel::isLeftFor(std::chrono::seconds time) const {
    return m_leftSince && Deadline::Clock::now() - *m_leftSince >= time;
}

void Panel::end() {
    if (m_recorder.isActive()) stopRecording();
    stopScan();
    for (const auto& page : std::exchange(m_pages, {}))
        page->close();
}

void Panel::takeFromPage(std::string_view message) {
    auto parsed = parsePageMessage(message);
    if (!parsed) return;
    if (const auto* const wish = std::get_if<PanelWish>(&*parsed)) return perform(*wish);
    forward(std::get<PageCommand>(std::move(*parsed)));
}

void Panel::forward(PageCommand command) {
    if (command.id == contract::kEditCredential && command.data.isString()) {
        const auto data = m_passwords.filledIn(command.data.asString());
        if (!data) return fail("The credential was not changed: its stored password is not known.");
        command.data = *data;
    }
    send(command);
}

void Panel::send(const PageCommand& command) {
    if (command.id == contract::kFullScan) m_nextScan = Deadline::in(kScanPatience);
    if (command.id == contract::kSetHotspotAutoConnect) m_isSwitchTurned = true;
    if (command.id == contract::kStopScan) m_nextScan = Deadline::never();
    if (!m_relay.send(command.port, serviceText(command)))
        fail("The service takes no commands: " + command.id + " was not sent.");
}

void Panel::ask(RecordedPort port, const char* question) {
    send({port, question, Json::Value()});
}

void Panel::stopScan() {
    if (m_nextScan < Deadline::never()) ask(RecordedPort::Spectral, contract::kStopScan);
}

void Panel::takeFromService(RecordedPort port, const std::string& message) {
    auto envelope = parseJsonObject(message);
    const auto event = envelope ? eventOf(*envelope) : std::nullopt;
    if (!event) return;
    if (port == RecordedPort::Hotspot) m_passwords.take(*event);
    if (event->id == contract::kSetHotspotAutoConnect) keepSwitch(*event);
    if (port == RecordedPort::Spectral && m_nextScan < Deadline::never())
        m_nextScan = Deadline::in(kScanPatience);
    if (!m_pages.empty()) tellAll(pageMessage(port, std::move(*envelope)));
    record([&] { m_recorder.add(port, message); });
}

// The service reads the switch when it starts, and leaves it to those who turn it to write it down.
void Panel::keepSwitch(const Event& event) {
    const Json::Value isOn = payloadOf(event);
    if (!std::exchange(m_isSwitchTurned, false) || !isOn.isBool()) return;
    const auto machine = m_relay.machine();
    if (!machine || !writeHotspotSwitch(*machine, isOn.asBool()))
        fail("The switch was turned, but it cannot be written down for the next start.");
}

void Panel::serviceChanged(bool isRunning) {
    m_passwords.forget();
    m_nextScan = Deadline::never();
    if (isRunning) {
        m_log.follow(m_relay.machine());
        tellNewsOfLog();
    }
    tellAll("service", service());
    if (isRunning && m_recorder.isActive()) askForRecording();
}

void Panel::perform(PanelWish wish) {
    wish == PanelWish::StartRecording ? startRecording() : stopRecording();
}

void Panel::startRecording() {
    if (m_recorder.isActive()) return;
    record([this] { m_recorder.start(); });
    if (!m_recorder.isActive()) return;
    tellRecording();
    askForRecording();
}

// A recording begins with how things stand.
void Panel::askForRecording() {
    for (const char* const question :
         {contract::kGetChannelList, contract::kGetCurrentChannel, contract::kFullScan})
        ask(RecordedPort::Spectral, question);
    for (const char* const question : HotspotNarrator::firstQuestions())
        ask(RecordedPort::Hotspot, question);
}

void Panel::stopRecording() {
    if (!m_recorder.isActive()) return;
    record([this] { m_recorder.stop(); });
    if (m_recorder.isActive()) return;
    tellRecording();
    tellAll("recordings", recordings());
}

/// Whatever can't be written ends the recording, and the pages are told.
template <class Work>
void Panel::record(Work work) try {
    work();
} catch (const ClientError& error) {
    fail(std::string("The recording has ended: ") + error.what());
    tellRecording();
    tellAll("recordings", recordings());
}

void Panel::tellRecording() {
    m_nextState = Deadline::in(kBetweenStates);
    tellAll("recording", m_recorder.state());
}

void Panel::tellNewsOfLog() {
    if (auto news = m_log.takeNews()) tellAll("log", std::move(*news));
}

void Panel::fail(const std::string& text) {
    Json::Value members(Json::objectValue);
    members["text"] = text;
    tellAll("failure", std::move(members));
}

Json::Value Panel::recordings() const {
    Json::Value members(Json::objectValue);
    members["files"] = m_recordings.list();
    return members;
}

// Nobody can ask the service for its switch.
Json::Value Panel::service() const {
    Json::Value members(Json::objectValue);
    members["running"] = m_relay.isRunning();
    const auto isSwitchedOn = m_relay.isRunning() ? hotspotSwitch(m_relay.machine()) : std::nullopt;
    if (isSwitchedOn) members["hotspot"] = *isSwitchedOn;
    return members;
}

void Panel::tellAll(std::string text) {
    const auto shared = std::make_shared<const std::string>(std::move(text));
    for (const auto& page : m_pages)
        page->send(shared);
}

}  // namespace vexa::client

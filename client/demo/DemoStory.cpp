#include "client/demo/DemoStory.h"

#include <algorithm>
#include <array>
#include <iomanip>
#include <regex>
#include <sstream>

#include "client/hotspot/CredentialText.h"
#include "client/machine/MachineRegistry.h"
#include "client/port/EventLines.h"
#include "client/port/JsonLine.h"
#include "client/terminal/Terminal.h"
#include "client/terminal/TerminalScreen.h"
#include "client/terminal/Text.h"
#include "contract/Ports.h"

namespace vexa::client {

using std::chrono::milliseconds;

namespace {

constexpr milliseconds kBetweenLooks{200};
/// How long the traveller stays in a network before he does something.
constexpr milliseconds kStay{1500};

/// What the traveller does some time after a network was joined.
struct Step {
    const char* joined;
    const char* command;
    const char* network;
    const char* sentence;
};
constexpr std::array kSteps{
    Step{"Gate 12", contract::kDisconnectNetwork, "Gate 12", "the traveller leaves \"Gate 12\""},
    Step{"Departures", contract::kConnectNetwork, "Gate 12", "the traveller asks for \"Gate 12\""}};

/// What of the log tells reasons.
constexpr std::array kReasons{"authMode=machineOrUser failed", "has been disconnected by user",
                              "exceeds maximum retry limit", "has been blocked due to user",
                              "Unblocked network with"};

constexpr const char* kReset = "\033[0m";
constexpr std::array kColours{"", "\033[32m", "\033[1m", "\033[2m"};

constexpr int kScreenRowsForCredentials = 34;
constexpr int kFewestStoryRows = 4;

/// What the other sentences tell as well.
bool isAside(const Event& event) {
    return event.id == contract::kDetectedHotspot || event.id == contract::kGetIsInternetAccess;
}

bool isReason(const std::string& line) {
    return std::any_of(kReasons.begin(), kReasons.end(),
                       [&](const char* part) { return line.find(part) != std::string::npos; });
}

/// A line of the log without its number, its time and the addresses.
std::string textOf(const std::string& line) {
    static const std::regex kHead(R"(^\[\d+\] \d\d/\d\d \d\d:\d\d:\d\d\s*)");
    static const std::regex kAddress(" and mac address=[0-9a-f:]{17}");
    return printable(std::regex_replace(std::regex_replace(line, kHead, ""), kAddress, " ..."));
}

void append(std::vector<std::string>& lines, const std::vector<std::string>& block) {
    lines.emplace_back();
    lines.insert(lines.end(), block.begin(), block.end());
}

}  // namespace

DemoStory::DemoStory(std::uint16_t port, const MachineFolder& machine, CredentialList stored,
                     Passwords passwords)
    : m_client(port),
      m_narrator([machine] { return readConnectionMethod(machine); }),
      m_stored(std::move(stored)),
      m_passwords(passwords),
      m_log(machine.dumpFolder()) {
    ask(HotspotNarrator::firstQuestions());
}

Deadline DemoStory::wake() const {
    return std::min(m_nextLook, m_nextStep);
}

std::vector<SideShow::Item> DemoStory::process() {
    std::vector<Item> items;
    takeEvents(items);
    act(items);
    takeReasons(items);
    return items;
}

void DemoStory::takeEvents(std::vector<Item>& items) {
    m_client.process();
    bool isAnything = false;
    while (const auto text = m_client.take()) {
        isAnything = true;
        const auto event = parseEvent(*text);
        if (!event) continue;
        items.push_back({eventLine(*text, m_passwords), ""});
        tell(items, *event);
    }
    if (!isAnything) m_client.requireOpen();
}

void DemoStory::tell(std::vector<Item>& items, const Event& event) {
    const std::size_t joins = m_narrator.joined().size();
    const auto sentences = m_narrator.tell(event);
    const bool isJoined = m_narrator.joined().size() > joins;
    if (isJoined) m_nextStep = Deadline::in(kStay);
    for (const std::string& sentence : sentences) {
        if (!isAside(event)) say(items, isJoined ? Speaker::Joining : Speaker::Service, "", sentence);
    }
    ask(m_narrator.takeQuestions());
}

void DemoStory::act(std::vector<Item>& items) {
    if (!m_nextStep.isOver()) return;
    m_nextStep = Deadline::never();
    if (m_stepsDone == kSteps.size() || m_narrator.joined().back() != kSteps[m_stepsDone].joined) return;
    const Step& step = kSteps[m_stepsDone++];
    const std::string command = commandText(step.command, networkData(step.network));
    m_client.send(command);
    say(items, Speaker::Traveller, command, step.sentence);
}

// The same reason is found again in every round; it is told once.
void DemoStory::takeReasons(std::vector<Item>& items) {
    if (!m_nextLook.isOver()) return;
    m_nextLook = Deadline::in(kBetweenLooks);
    for (const LogFiles::Line& line : m_log.takeLines()) {
        if (!isReason(line.text)) continue;
        const std::string text = textOf(line.text);
        if (std::find(m_reasons.begin(), m_reasons.end(), text) != m_reasons.end()) continue;
        m_reasons.push_back(text);
        say(items, Speaker::Log, jsonLine(lineJson(line)), "log: " + text);
    }
}

void DemoStory::say(std::vector<Item>& items, Speaker speaker, std::string json,
                    const std::string& sentence) {
    std::ostringstream line;
    const double seconds = std::chrono::duration<double>(Deadline::Clock::now() - m_start).count();
    line << std::fixed << std::setprecision(1) << std::setw(5) << seconds << " s  " << sentence;
    m_lines.push_back({speaker, line.str()});
    items.push_back({std::move(json), sentence});
}

void DemoStory::ask(const std::vector<const char*>& questions) {
    for (const char* question : questions)
        m_client.send(commandText(question));
}

std::vector<std::string> DemoStory::opening(bool json) const {
    if (json) {
        Json::Value object(Json::objectValue);
        object["credentials"] = credentialsJson(m_stored, m_passwords);
        return {jsonLine(object)};
    }
    return credentialLines(std::nullopt);
}

std::vector<std::string> DemoStory::credentialLines(std::optional<int> columns) const {
    auto lines = credentialTable(m_stored, Passwords::Hidden, columns);
    lines.insert(lines.begin(),
                 "Stored " + counted(m_stored.size(), "credential") + ", in the order of priority:");
    return lines;
}

std::vector<std::string> DemoStory::lines(const Room& room) const {
    std::vector<std::string> all;
    if (room.screenRows >= kScreenRowsForCredentials) append(all, credentialLines(room.columns - 1));
    append(all, networkTable(m_narrator.networks()));
    for (std::string& line : all)
        line = cutToColumns(line, room.columns - 1, ellipsis());
    all.emplace_back();
    const int left = std::max(kFewestStoryRows, room.rows - static_cast<int>(all.size()));
    const std::size_t shown = std::min(m_lines.size(), static_cast<std::size_t>(left));
    std::for_each(m_lines.end() - static_cast<std::ptrdiff_t>(shown), m_lines.end(),
                  [&](const Line& line) { all.push_back(paint(line, room)); });
    return all;
}

std::string DemoStory::paint(const Line& line, const Room& room) const {
    const std::string text = cutToColumns(line.text, room.columns - 1, ellipsis());
    const std::string colour = kColours[static_cast<std::size_t>(line.speaker)];
    return room.colour && !colour.empty() ? colour + text + kReset : text;
}

std::string DemoStory::summary() const {
    std::string names;
    for (const std::string& name : m_narrator.joined())
        names += (names.empty() ? "" : ", ") + printable(name);
    return names.empty() ? "no network joined" : "joined " + names;
}

void DemoStory::addSummary(Json::Value& object) const {
    object["joined"] = Json::Value(Json::arrayValue);
    for (const std::string& name : m_narrator.joined())
        object["joined"].append(name);
}

}  // namespace vexa::client

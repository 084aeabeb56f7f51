#include "engine/World.h"

#include <json/reader.h>
#include <json/writer.h>

#include <fstream>
#include <sstream>
#include <stdexcept>

#include "base/DiagnosticLog.h"
#include "hotspotport/SAHotSpotPortlink.h"
#include "platform/ClockControl.h"
#include "service/CommandLine.h"
#include "service/Service.h"
#include "simulation/control/Performance.h"
#include "simulation/control/Timeline.h"
#include "simulation/scenario/Scenario.h"

namespace vexa::test {

namespace {

using namespace std::chrono_literals;

Json::Value parse(const std::string& text) {
    Json::Value value;
    std::string errors;
    std::istringstream stream(text);
    Json::CharReaderBuilder builder;
    if (!text.empty() && !Json::parseFromStream(builder, stream, &value, &errors))
        return Json::Value::nullSingleton();
    return value;
}

std::string oneLine(const Json::Value& value) {
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    return Json::writeString(builder, value);
}

std::string contentOf(const std::filesystem::path& file) {
    const std::ifstream stream(file, std::ios::binary);
    std::ostringstream content;
    content << stream.rdbuf();
    return content.str();
}

constexpr const char* kConfigWithLog =
    "<?xml version=\"1.0\" "
    "encoding=\"UTF-8\"?><configurations><global><dump_file_path>hs20log.txt</dump_file_path>"
    "<create_new_dump_file>false</create_new_dump_file><autoconnect>true</autoconnect><enabledump>true</"
    "enabledump>"
    "<dumplevel>0</dumplevel><homerealm></homerealm><nextcredid>1</nextcredid></global><credentials></"
    "credentials>"
    "<users></users></configurations>";

// A story wants to read the log, unless it brings a configuration of its own.
simulation::Scenario withLog(simulation::Scenario scenario) {
    if (!scenario.config) scenario.config = kConfigWithLog;
    return scenario;
}

// Nobody binds these: it is the check of the command line that wants ports which no row of the host's table
// has.
std::int32_t unusedPort(std::int32_t from) {
    for (std::int32_t port = from;; ++port) {
        bool isFree = false;
        if (isTcpPortFree(isFree, static_cast<std::uint16_t>(port)) && isFree) return port;
    }
}

}  // namespace

Client::Client(std::int32_t port) : m_client(InProcessClient::connect(port)) {
    for (int tries = 0; !m_client; ++tries) {
        if (tries == 1000) throw std::runtime_error("nothing serves port " + std::to_string(port));
        platform::advance(1ms);
        m_client = InProcessClient::connect(port);
    }
}

void Client::send(const std::string& command, const std::string& data) {
    Json::Value message;
    message["CommandId"] = command;
    if (!data.empty()) message["Data"] = data;
    m_client->send(oneLine(message));
}

std::vector<ClientEvent> Client::events() {
    std::vector<ClientEvent> events;
    for (const std::string& text : m_client->receive()) {
        m_transcript += text;
        const Json::Value event = parse(text);
        const std::string data = event.get("Data", "").asString();
        events.push_back({event["EventId"].asString(), event["Source"].asString(), event.isMember("Data"),
                          data, parse(data)});
    }
    return events;
}

std::string Client::ids() {
    std::string ids;
    for (const ClientEvent& event : events())
        ids += (ids.empty() ? "" : " ") + event.id;
    return ids;
}

World::World(const std::string& scenario, const std::filesystem::path& folder)
    : m_folder(folder),
      m_machine(withLog(simulation::parseScenario(scenario)), folder),
      m_stopMutex(std::make_unique<platform::NamedMutex>("{39EAA3ED-1A26-46B7-90A7-AAFFECE80392}",
                                                         platform::NamedMutex::Owner::Yes)) {
    simulation::beginTimeline(m_machine);
    const std::int32_t saPort = unusedPort(2100);
    const std::int32_t hs20Port = unusedPort(saPort + 1);
    m_service.start("main", [this, commandLine = std::to_wstring(saPort) + L" " + std::to_wstring(hs20Port)] {
        m_exitCode = runService(&commandLine);
    });
    m_hotspot = std::make_unique<Client>(hs20Port);
    m_spectral = std::make_unique<Client>(saPort);
    advance(0ms);
}

Json::Value World::perform(const std::string& message) {
    Json::Value answer = simulation::perform(m_machine, parse(message));
    if (!answer["ok"].asBool()) throw std::runtime_error(message + ": " + oneLine(answer));
    return answer["result"];
}

void World::advance(platform::Duration span) {
    platform::advance(span);
}

std::string World::log() {
    DiagnosticLog::instance().flushToFile();
    return contentOf(logFile());
}

std::size_t World::logSize() {
    DiagnosticLog::instance().flushToFile();
    std::error_code error;
    const std::uintmax_t size = std::filesystem::file_size(logFile(), error);
    return error ? 0 : size;
}

std::filesystem::path World::logFile() const {
    return store() / "Dump" / "hs20log.txt_user.txt";
}

std::filesystem::path World::store() const {
    return m_folder / "Public" / "Roaming" / "Korvane";
}

std::string World::config() const {
    return contentOf(store() / "config.xml");
}

std::string World::debugLog() const {
    return contentOf(m_folder / "debug.log");
}

int World::stop() {
    m_stopMutex->release();
    m_service.join();
    SAHotSpotPortlink::instance().close();
    m_machine.stop();
    return m_exitCode;
}

}  // namespace vexa::test

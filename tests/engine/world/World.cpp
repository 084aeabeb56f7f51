#include "engine/world/World.h"

#include <json/reader.h>
#include <json/writer.h>

#include <fstream>
#include <sstream>
#include <stdexcept>

#include "base/DiagnosticLog.h"
#include "channel/StyledText.h"
#include "contract/Process.h"
#include "hotspotport/SAHotSpotPortlink.h"
#include "platform/ClockControl.h"
#include "platform/simulated/TcpSockets.h"
#include "service/Service.h"
#include "simulation/control/Performance.h"
#include "simulation/control/Timeline.h"
#include "simulation/scenario/Scenario.h"

namespace vexa::test {

namespace {

using namespace std::chrono_literals;

// The machine has a TCP table of its own, so no port is busy.
constexpr int kSaPort = 2100;
constexpr int kHs20Port = 2101;

constexpr const char* kConfig = R"(<?xml version="1.0" encoding="UTF-8"?><configurations><global>
<dump_file_path>hs20log.txt</dump_file_path><create_new_dump_file>false</create_new_dump_file>
<autoconnect>true</autoconnect><enabledump>true</enabledump><dumplevel>0</dumplevel><homerealm></homerealm>
<nextcredid>1</nextcredid></global><credentials></credentials><users></users></configurations>)";

simulation::Scenario configured(simulation::Scenario scenario, bool withLog) {
    const std::string on = "<enabledump>true";
    if (!scenario.config) scenario.config = kConfig;
    if (const std::size_t at = scenario.config->find(on); !withLog && at != std::string::npos)
        scenario.config->replace(at, on.size(), "<enabledump>false");
    return scenario;
}

bool hasPrefix(const std::string& line) {
    const std::size_t end = line.find("] ");
    return !line.empty() && line[0] == '[' && end != std::string::npos && line.size() >= end + 18 &&
           line[end + 4] == '/';
}

}  // namespace

std::string compact(const Json::Value& value) {
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    return Json::writeString(builder, value);
}

Json::Value parsed(const std::string& text) {
    Json::Value value;
    std::string errors;
    std::istringstream stream(text);
    const Json::CharReaderBuilder builder;
    if (text.empty() || !Json::parseFromStream(builder, stream, &value, &errors)) return {};
    return value;
}

std::string contentOf(const std::filesystem::path& file) {
    const std::ifstream stream(file, std::ios::binary);
    std::ostringstream content;
    content << stream.rdbuf();
    return content.str();
}

std::string doing(const std::string& action, const std::string& members) {
    return R"({"do":")" + action + "\"" + (members.empty() ? "" : ",") + members + "}";
}

std::string passing(platform::Duration span) {
    return doing("advance", R"("ms":)" + std::to_string(span / 1ms));
}

std::string sending(const std::string& command, const std::string& data) {
    Json::Value message;
    message["CommandId"] = command;
    if (!data.empty()) message["Data"] = data;
    return compact(message);
}

Client::Client(std::int32_t port) : m_client(InProcessClient::connect(port)) {
    for (int tries = 0; !m_client; ++tries) {
        if (tries == 1000) throw std::runtime_error("nothing serves port " + std::to_string(port));
        platform::advance(1ms);
        m_client = InProcessClient::connect(port);
    }
}

std::vector<ClientEvent> Client::events() {
    std::vector<ClientEvent> events;
    for (const std::string& text : m_client->receive()) {
        m_transcript += text;
        const Json::Value event = parsed(text);
        const std::string data = event.get("Data", "").asString();
        events.push_back({event["EventId"].asString(), event["Source"].asString(), event.isMember("Data"),
                          data, parsed(data)});
        const Json::Value& inner = events.back().data;
        const bool isStructured = inner.isArray() || inner.isObject();
        if (toStyledText(event) != text || (isStructured && toStyledText(inner) != data))
            throw std::runtime_error("not styled: " + text);
    }
    return events;
}

World::World(const std::string& scenario, const std::filesystem::path& folder, bool withLog)
    : m_folder(folder),
      m_machine(configured(simulation::parseScenario(scenario), withLog), folder),
      m_stopMutex(
          std::make_unique<platform::NamedMutex>(contract::kStopMutex, platform::NamedMutex::Owner::Yes)) {
    simulation::beginTimeline(m_machine);
    platform::setTcpSockets({});
    m_service.start("main",
                    [this, commandLine = std::to_wstring(kSaPort) + L" " + std::to_wstring(kHs20Port)] {
                        m_exitCode = runService(&commandLine);
                    });
    m_hotspot = std::make_unique<Client>(kHs20Port);
    m_spectral = std::make_unique<Client>(kSaPort);
    advance(0ms);
}

Json::Value World::perform(const std::string& message) {
    Json::Value answer = simulation::perform(m_machine, parsed(message));
    if (!answer["ok"].asBool()) throw std::runtime_error(message + ": " + compact(answer));
    return answer["result"];
}

void World::advance(platform::Duration span) {
    platform::advance(span);
}

void World::play(const std::vector<std::string>& deeds) {
    for (const std::string& deed : deeds)
        if (deed.starts_with(R"({"do":"advance")")) {
            advance(std::chrono::milliseconds(parsed(deed)["ms"].asInt()));
        } else if (deed.starts_with(R"({"do":)")) {
            perform(deed);
        } else {
            hotspot().sendRaw(deed);
            advance(0ms);
        }
}

void World::forget() {
    act("clearCalls");
    spectral().events();
    hotspot().events();
    m_forgotten = log().size();
}

std::string World::log() {
    DiagnosticLog::instance().flushToFile();
    return contentOf(logFile());
}

std::string World::messages() {
    std::istringstream stream(log().substr(m_forgotten));
    std::string messages;
    for (std::string line; std::getline(stream, line);) {
        if (hasPrefix(line)) line.erase(0, line.find("] ") + 18);
        if (!line.empty()) messages += line + "\n";
    }
    return messages;
}

void World::writeConfig(const std::string& text) {
    std::ofstream(store() / "config.xml", std::ios::binary | std::ios::trunc) << text;
}

int World::stop() {
    m_stopMutex->release();
    m_service.join();
    if (InProcessClient::connect(kSaPort) || !InProcessClient::connect(kHs20Port))
        throw std::runtime_error("the spectral port ends with the service, the other behind it");
    SAHotSpotPortlink::instance().close();
    m_machine.stop();
    return m_exitCode;
}

}  // namespace vexa::test

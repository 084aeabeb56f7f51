#include "TestMachine.h"

#include <gtest/gtest.h>
#include <stdlib.h>

#include <algorithm>

#include "platform/ClockControl.h"
#include "simulation/control/Performance.h"
#include "simulation/control/Timeline.h"
#include "simulation/scenario/JsonText.h"

namespace vexa::simulation {

TemporaryFolder::TemporaryFolder() {
    std::string name = (std::filesystem::temp_directory_path() / "vexa-test-XXXXXX").string();
    if (!::mkdtemp(name.data())) ADD_FAILURE() << "no temporary folder";
    m_path = name;
}

TemporaryFolder::~TemporaryFolder() {
    std::error_code error;
    std::filesystem::remove_all(m_path, error);
}

Json::Value json(std::string text) {
    std::replace(text.begin(), text.end(), '\'', '"');
    std::string error;
    const auto value = parseJson(text, error);
    if (!value) ADD_FAILURE() << error << " in " << text;
    return value.value_or(Json::Value());
}

Listener::Listener() {
    DWORD version = 0;
    EXPECT_EQ(WlanOpenHandle(2, nullptr, &version, &m_handle), ERROR_SUCCESS);
    EXPECT_EQ(WlanRegisterNotification(m_handle, WLAN_NOTIFICATION_SOURCE_ALL, FALSE, callback, this, nullptr,
                                       nullptr),
              ERROR_SUCCESS);
}

Listener::~Listener() {
    WlanCloseHandle(m_handle, nullptr);
}

std::vector<Heard> Listener::heard() {
    const platform::LockGuard<platform::Mutex> lock(m_mutex);
    return m_heard;
}

std::string Listener::codes() {
    std::string text;
    for (const Heard& one : heard()) {
        text += (text.empty() ? "" : " ") + std::to_string(one.source) + "/" + std::to_string(one.code);
    }
    return text;
}

void Listener::callback(PWLAN_NOTIFICATION_DATA data, PVOID context) {
    auto& self = *static_cast<Listener*>(context);
    if (self.onNotification) self.onNotification(*data);
    const auto* bytes = static_cast<const std::uint8_t*>(data->pData);
    const platform::LockGuard<platform::Mutex> lock(self.m_mutex);
    self.m_heard.push_back({data->NotificationSource, data->NotificationCode, data->InterfaceGuid,
                            bytes ? Bytes(bytes, bytes + data->dwDataSize) : Bytes{}});
}

TestMachine::TestMachine(const std::string& scenario) {
    platform::setClockSpeed(0);
    m_machine = std::make_unique<Machine>(parseScenario(compactJson(json(scenario))), m_folder.path());
    beginTimeline(*m_machine);
}

TestMachine::~TestMachine() {
    m_machine.reset();
    platform::setClockSpeed(1);
}

std::string TestMachine::ask(const std::string& message) {
    return compactJson(perform(*m_machine, json(message)));
}

Json::Value TestMachine::query(const std::string& message) {
    const Json::Value answer = perform(*m_machine, json(message));
    EXPECT_TRUE(answer["ok"].asBool()) << compactJson(answer);
    return answer["result"];
}

void TestMachine::advance(int milliseconds) {
    EXPECT_TRUE(platform::advance(std::chrono::milliseconds(milliseconds)));
}

GUID TestMachine::guid() const {
    return m_machine->adapters().guid(0);
}

}  // namespace vexa::simulation

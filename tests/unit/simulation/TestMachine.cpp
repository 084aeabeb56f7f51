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
    return compactJson(simulation::perform(*m_machine, json(message)));
}

void TestMachine::perform(const std::string& action) {
    EXPECT_EQ(ask(action), R"({"ok":true})") << action;
}

Json::Value TestMachine::query(const std::string& message) {
    const Json::Value answer = simulation::perform(*m_machine, json(message));
    EXPECT_TRUE(answer["ok"].asBool()) << compactJson(answer);
    return answer["result"];
}

void TestMachine::advance(int milliseconds) {
    EXPECT_TRUE(platform::advance(std::chrono::milliseconds(milliseconds)));
}

}  // namespace vexa::simulation

#pragma once

#include <json/value.h>

#include <filesystem>
#include <memory>
#include <string>

#include "simulation/Machine.h"

namespace vexa::simulation {

/// A folder that is gone at the end of the test.
class TemporaryFolder {
public:
    TemporaryFolder();
    ~TemporaryFolder();
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;

    const std::filesystem::path& path() const { return m_path; }

private:
    std::filesystem::path m_path;
};

/// JSON as tests write it: with ' in place of ".
Json::Value json(std::string text);

/// A machine whose clock stands still but for advance().
class TestMachine {
public:
    explicit TestMachine(const std::string& scenario = "{}");
    ~TestMachine();
    TestMachine(const TestMachine&) = delete;
    TestMachine& operator=(const TestMachine&) = delete;

    Machine& operator*() { return *m_machine; }
    Machine* operator->() { return m_machine.get(); }

    /// The answer of the control channel, as one line.
    std::string ask(const std::string& message);

    /// Carries out an action; fails the test if it is refused.
    void perform(const std::string& action);

    /// The result of a query; fails the test if there is none.
    Json::Value query(const std::string& message);

    void advance(int milliseconds);

private:
    TemporaryFolder m_folder;
    std::unique_ptr<Machine> m_machine;
};

}  // namespace vexa::simulation

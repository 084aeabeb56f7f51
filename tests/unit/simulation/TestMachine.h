#pragma once

#include <json/value.h>

#include <deque>
#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "platform/Event.h"
#include "platform/Mutex.h"
#include "platform/WlanApi.h"
#include "simulation/Machine.h"
#include "simulation/text/Text.h"

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

struct Heard {
    DWORD source;
    DWORD code;
    GUID guid;
    Bytes data;
};

/// An open handle of the WLAN service whose notifications are kept.
class Listener {
public:
    Listener();
    ~Listener();
    Listener(const Listener&) = delete;
    Listener& operator=(const Listener&) = delete;

    HANDLE handle() const { return m_handle; }
    std::vector<Heard> heard();

    /// "8/13 16/7": source and code of each notification.
    std::string codes();

    /// Called within the callback, before the notification is kept.
    std::function<void(const WLAN_NOTIFICATION_DATA&)> onNotification;

private:
    static void callback(PWLAN_NOTIFICATION_DATA data, PVOID context);

    HANDLE m_handle = nullptr;
    platform::Mutex m_mutex;
    std::vector<Heard> m_heard GUARDED_BY(m_mutex);
};

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

    /// The result of a query; fails the test if there is none.
    Json::Value query(const std::string& message);

    void advance(int milliseconds);
    GUID guid() const;

private:
    TemporaryFolder m_folder;
    std::unique_ptr<Machine> m_machine;
};

}  // namespace vexa::simulation

#pragma once

#include <functional>
#include <string>
#include <vector>

#include "TestMachine.h"
#include "platform/Mutex.h"
#include "platform/WlanApi.h"
#include "simulation/text/Text.h"

namespace vexa::simulation {

using Texts = std::vector<std::string>;

Texts operator+(Texts first, const Texts& second);

/// Hex as tests write it: with blanks between the fields.
std::string hex(std::string spaced);
std::string zeros(std::size_t bytes);

/// Some bytes of a block, as hex.
std::string at(const Bytes& block, std::size_t offset, std::size_t size);

/// Profiles as a client of the WLAN service writes them.
std::string ttlsProfile(const std::string& name, const std::string& ssidHex,
                        const std::string& username = "u", const std::string& password = "p");
std::string tlsProfile(const std::string& name, const std::string& ssidHex, const std::string& caCert,
                       const std::string& authMode);

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

/// A client of the WLAN service of a machine of its own. It writes down what it is told: for each
/// notification its source and code, the state and the channel that queries answer within the handler, and
/// the reason where there is one: "8/10 disconnected 0 00038003".
class Station {
public:
    explicit Station(const std::string& scenario = "{}");

    DWORD connect(const std::string& profile);
    DWORD discover(const std::string& ssid);
    DWORD connect(WLAN_CONNECTION_PARAMETERS parameters);
    DWORD disconnect();
    DWORD query(WLAN_INTF_OPCODE opcode, Bytes& answer);
    DWORD control(WLAN_IHV_CONTROL_TYPE type, Bytes request, DWORD capacity = 0);

    /// What the last control gave back.
    Bytes output;

    /// An action of the machine, or a request in words: "connect Cafe", "discover Cafe", "disconnect". Fails
    /// the test if it is refused.
    void act(const std::string& what);

    /// What has been told since the last call, once all that is due has been delivered.
    Texts told();

    /// The data blocks of the adapter's modules since the last call, as hex.
    Texts blocks();

    std::string state();

    TestMachine machine;

private:
    Texts m_told;  // outlives the listener, whose callback writes it
    std::size_t m_seenBlocks = 0;

public:
    Listener listener;
    GUID guid;  ///< The adapter's.
};

}  // namespace vexa::simulation

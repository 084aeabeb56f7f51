#pragma once

#include <string>
#include <vector>

#include "TestMachine.h"

namespace vexa::simulation {

/// Profiles as a client of the WLAN service writes them.
std::string ttlsProfile(const std::string& name, const std::string& ssidHex, const std::string& username,
                        const std::string& password);
std::string tlsProfile(const std::string& name, const std::string& ssidHex, const std::string& caCert,
                       const std::string& authMode);

/// A client that connects, and writes down what it is told: for each notification its source and code, the
/// state and the channel that queries answer within the handler, and the reason where there is one:
/// "8/10 disconnected 0 00038003".
class Station {
public:
    explicit Station(const std::string& scenario = "{}");

    DWORD connect(const std::string& profile);
    DWORD discover(const std::string& ssid);
    DWORD connect(WLAN_CONNECTION_PARAMETERS parameters);
    DWORD disconnect();
    DWORD query(WLAN_INTF_OPCODE opcode, Bytes& answer);

    /// Joins the network of this name, which must let it in, and forgets what it was told.
    void join(const std::string& ssidHex);

    /// What has been told since the last call, once all that is due has been delivered.
    std::vector<std::string> told();

    void perform(const std::string& action);
    std::string state();

    TestMachine machine;

private:
    std::vector<std::string> m_told;  // outlives the listener, whose callback writes it

public:
    Listener listener;
};

using Told = std::vector<std::string>;

Told operator+(Told first, const Told& second);

}  // namespace vexa::simulation

#include <algorithm>
#include <array>
#include <optional>
#include <string>
#include <string_view>

#include "base/DiagnosticLog.h"
#include "channel/JsonText.h"
#include "connection/SupplicantMgr.h"
#include "contract/Ports.h"
#include "hotspotport/CredentialCommands.h"
#include "hotspotport/SAHotSpotPortlink.h"

namespace vexa {

namespace {

using Server = SAHotSpotPortlink;

/// False: the command's data can't be read.
using Action = bool (*)(Server& server, const Json::Value& data);

struct Command {
    std::string_view id;
    Action act;
    bool listsAlways = false;  // answers with the list of credentials whatever its data is
};

template <void (Server::*Send)()>
bool answer(Server& server, const Json::Value& /*data*/) {
    (server.*Send)();
    return true;
}

// The client learns of a change that failed by a list that is as it was.
template <Action Change>
bool changeCredentials(Server& server, const Json::Value& data) {
    const bool isReadable = Change(server, data);
    server.SendCredentialList();
    return isReadable;
}

bool reload(Server& server, const Json::Value& /*data*/) {
    if (hotspotSupplicant(server)) SupplicantMgr::instance().reloadData();
    return true;
}

// Sends nothing while no adapter is present.
bool networkList(Server& server, const Json::Value& /*data*/) {
    if (server.m_bCardIn) server.SendNetworkList(nullptr);
    return true;
}

bool autoConnect(Server& server, const Json::Value& data) {
    if (!data.isNull() && !data.isBool()) return false;
    server.setHotSpotAutoConnect(data.isBool() && data.asBool());
    return true;
}

// Nothing for a name of a wrong type.
std::optional<std::string> networkName(const Json::Value& data) {
    if (data.isObject() && data["NetWorkName"].isBool()) return std::nullopt;
    return readText(data, "NetWorkName");
}

bool connectNetwork(Server& server, const Json::Value& data) {
    const auto name = networkName(data);
    if (!name && !data.isObject()) return false;
    server.connectNetworkByName(name);
    return true;
}

bool disconnectNetwork(Server& server, const Json::Value& data) {
    const auto name = networkName(data);
    if (name) server.disconnectNetworkByName(*name);
    return name.has_value();
}

constexpr std::array<Command, 14> kCommands = {{
    {contract::kUpdateNetworkRealm, answer<&Server::updateNetworkRealm>},
    {contract::kGetRadio, answer<&Server::SendRadioState>},
    {contract::kSetHotspotAutoConnect, autoConnect},
    {contract::kGetIsCardIn, answer<&Server::SendCardState>},
    {contract::kReadCredentialFromFile, reload},
    {contract::kGetAllCredentialList, answer<&Server::SendCredentialList>, true},
    {contract::kAddCredential, changeCredentials<addCredential>, true},
    {contract::kDeleteCredential, changeCredentials<deleteCredential>, true},
    {contract::kEditCredential, changeCredentials<editCredential>, true},
    {contract::kSetPositionCredential, changeCredentials<setCredentialPosition>, true},
    {contract::kConnectNetwork, connectNetwork},
    {contract::kDisconnectNetwork, disconnectNetwork},
    {contract::kGetAllNetworkList, networkList},
    {contract::kGetIsInternetAccess, answer<&Server::SendInternetAccess>},
}};

void logInvalidCommand(const std::string& id) {
    Log(6, "ERROR: Invalid command received from UI, command=%s", id.c_str());
}

}  // namespace

void SAHotSpotPortlink::OnIpcMessage(const char* bytes, std::uint32_t length, void* context) {
    if (context == nullptr || bytes == nullptr || length == 0) return;
    const bool isHandled = withinMemoryOfJson([&] {
        if (const auto message = parseReceived({bytes, length}))
            static_cast<Server*>(context)->HandleCommand(*message);
    });
    if (!isHandled) Log(6, "ERROR: Out of memory, a message from UI was not handled to its end.");
}

void SAHotSpotPortlink::HandleCommand(const Json::Value& root) {
    const auto id = readText(root, "CommandId");
    if (!id) return logInvalidCommand("");
    const auto command = std::find_if(kCommands.begin(), kCommands.end(),
                                      [&](const Command& candidate) { return candidate.id == *id; });
    if (command == kCommands.end()) return logInvalidCommand(*id);
    std::optional<std::string> dataText;
    bool isDone = false;
    if (!withinMemoryOfJson([&] {
            dataText = readText(root, "Data");
            isDone = dataText && command->act(*this, parseJsonText(*dataText));
        })) {
        Log(6, "ERROR: Out of memory, command=%s was not carried out to its end.", id->c_str());
        dataText.reset();
    } else if (!isDone) {
        Log(6, "ERROR: Invalid data received from UI, command=%s", id->c_str());
    }
    if (!dataText && command->listsAlways) SendCredentialList();
}

}  // namespace vexa

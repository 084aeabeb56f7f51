#include "client/panel/PanelMessages.h"

#include <array>

#include "client/port/JsonLine.h"
#include "client/port/Passwords.h"
#include "client/terminal/Text.h"
#include "contract/Ports.h"
#include "text/OneOf.h"

namespace vexa::client {

namespace {

constexpr std::string_view kSpectralName = "spectral";
constexpr std::string_view kHotspotName = "hotspot";
constexpr std::string_view kPanelName = "panel";

constexpr std::array kSpectralCommands{contract::kFullScan, contract::kStopScan, contract::kGetCurrentChannel,
                                       contract::kGetChannelList};
constexpr std::array kHotspotCommands{contract::kGetAllNetworkList,
                                      contract::kGetAllCredentialList,
                                      contract::kGetIsInternetAccess,
                                      contract::kGetIsCardIn,
                                      contract::kGetRadio,
                                      contract::kSetHotspotAutoConnect,
                                      contract::kUpdateNetworkRealm,
                                      contract::kReadCredentialFromFile,
                                      contract::kAddCredential,
                                      contract::kDeleteCredential,
                                      contract::kEditCredential,
                                      contract::kSetPositionCredential,
                                      contract::kConnectNetwork,
                                      contract::kDisconnectNetwork};

// What is no UTF-8 would cost the page its connection.
std::string wrapped(std::string_view port, const Json::Value& message) {
    return "{\"port\":\"" + std::string(port) + "\",\"message\":" + asUtf8(jsonLine(message)) + "}";
}

std::optional<PageCommand> commandOf(RecordedPort port, const Json::Value& message) {
    const Json::Value& id = message["CommandId"];
    const Json::Value& data = message["Data"];
    if (!id.isString() || !(data.isString() || data.isBool() || data.isNull())) return std::nullopt;
    PageCommand command{port, id.asString(), data};
    const bool isKnown = port == RecordedPort::Spectral ? isOneOf(kSpectralCommands, command.id)
                                                        : isOneOf(kHotspotCommands, command.id);
    return isKnown ? std::optional(std::move(command)) : std::nullopt;
}

std::optional<PanelWish> wishOf(const Json::Value& message) {
    if (message["command"] == "startRecording") return PanelWish::StartRecording;
    if (message["command"] == "stopRecording") return PanelWish::StopRecording;
    return std::nullopt;
}

}  // namespace

std::string pageMessage(RecordedPort port, Json::Value envelope) {
    hidePasswords(envelope);
    return wrapped(port == RecordedPort::Spectral ? kSpectralName : kHotspotName, envelope);
}

std::string panelMessage(const char* event, Json::Value members) {
    members["event"] = event;
    return wrapped(kPanelName, members);
}

std::optional<std::variant<PageCommand, PanelWish>> parsePageMessage(std::string_view text) {
    const auto parsed = parseJsonObject(text);
    if (!parsed) return std::nullopt;
    const Json::Value& object = *parsed;
    const Json::Value& port = object["port"];
    const Json::Value& message = object["message"];
    if (!port.isString() || !message.isObject()) return std::nullopt;
    if (port.asString() == kPanelName) return wishOf(message);
    if (port.asString() == kSpectralName) return commandOf(RecordedPort::Spectral, message);
    if (port.asString() == kHotspotName) return commandOf(RecordedPort::Hotspot, message);
    return std::nullopt;
}

std::string serviceText(const PageCommand& command) {
    Json::Value object(Json::objectValue);
    object["CommandId"] = command.id;
    if (!command.data.isNull()) object["Data"] = command.data;
    return jsonLine(object);
}

}  // namespace vexa::client

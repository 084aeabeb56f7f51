#include <algorithm>
#include <array>
#include <string_view>

#include "base/DiagnosticLog.h"
#include "protocol/JsonText.h"
#include "protocol/SAHotSpotPortlink.h"

namespace vexa {

namespace {

using Server = SAHotSpotPortlink;

struct Command {
    std::string_view id;
    void (*act)(Server& server, const Json::Value& data);
};

constexpr std::array<Command, 2> kCommands = {{
    {"GET_RADIO", [](Server& server, const Json::Value&) { server.SendRadioState(); }},
    {"GET_IS_CARD_IN", [](Server& server, const Json::Value&) { server.SendCardState(); }},
}};

void logInvalidCommand(const std::string& id) {
    Log(6, "ERROR: Invalid command received from UI, command=%s", id.c_str());
}

}  // namespace

void SAHotSpotPortlink::OnIpcMessage(const char* bytes, std::uint32_t length, void* context) {
    if (context == nullptr || bytes == nullptr || length == 0) return;
    static_cast<Server*>(context)->HandleCommand(parseJsonText({bytes, length}));
}

void SAHotSpotPortlink::HandleCommand(const Json::Value& root) {
    const auto id = readText(root, "CommandId");
    const auto dataText = readText(root, "Data");
    if (!id || !dataText) return logInvalidCommand(id.value_or(""));
    const Json::Value data = parseJsonText(*dataText);
    const auto command = std::find_if(kCommands.begin(), kCommands.end(),
                                      [&](const Command& candidate) { return candidate.id == *id; });
    if (command == kCommands.end()) return logInvalidCommand(*id);
    command->act(*this, data);
}

}  // namespace vexa

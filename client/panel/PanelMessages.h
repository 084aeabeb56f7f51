#pragma once

#include <json/value.h>

#include <optional>
#include <string>
#include <string_view>
#include <variant>

#include "client/record/Recording.h"

namespace vexa::client {

// The messages between a page and the panel; each is a JSON object with the name of a port and what was said
// there.

/// An event of the service, without passwords.
std::string pageMessage(RecordedPort port, Json::Value envelope);

/// An event of the panel's own.
std::string panelMessage(const char* event, Json::Value members = Json::Value(Json::objectValue));

/// A command of a page for the service: one that the port knows, with data if it has any.
struct PageCommand {
    RecordedPort port = RecordedPort::Spectral;
    std::string id;
    Json::Value data;
};

enum class PanelWish { StartRecording, StopRecording };

/// What a page says. Nothing else passes: not another command, not another member of one.
std::optional<std::variant<PageCommand, PanelWish>> parsePageMessage(std::string_view text);

/// The command as the service takes it.
std::string serviceText(const PageCommand& command);

}  // namespace vexa::client

#include "engine/StoreStory.h"

#include <json/reader.h>

#include <fstream>
#include <sstream>

namespace vexa::test {

using namespace std::chrono_literals;

std::string list(World& world, const std::string& command, const std::string& data) {
    world.hotspot().send(command, data);
    world.advance(0ms);
    std::string text;
    for (const ClientEvent& event : world.hotspot().events()) {
        if (event.id != "GET_ALL_CREDENTIAL_LIST") {
            text += event.id + " ";
            continue;
        }
        if (event.data.isNull()) text += event.dataText;
        for (const Json::Value& credential : event.data)
            text += (&credential == &*event.data.begin() ? "" : ", ") + credential["Id"].asString() + " " +
                    credential["CredentialName"].asString();
        if (!event.data.isNull()) text += "\n";
    }
    return text;
}

std::string ttlsData(const std::string& realm) {
    Json::Value data;
    data["CredentialEapMethod"] = 2;
    data["Type"] = 1;
    data["RealName"] = realm;
    data["Username"] = "user";
    data["Password"] = "secret";
    return data.toStyledString();
}

std::string tlsData(const std::string& realm) {
    Json::Value data;
    data["CredentialEapMethod"] = 1;
    data["Type"] = 3;
    data["RealName"] = realm;
    data["CaCert"] = "ca";
    data["ClientCert"] = "client";
    return data.toStyledString();
}

Json::Value parsed(const std::string& json) {
    Json::Value value;
    std::string errors;
    std::istringstream stream(json);
    const Json::CharReaderBuilder builder;
    if (!Json::parseFromStream(builder, stream, &value, &errors)) return {};
    return value;
}

std::string count(std::string_view text, std::string_view part) {
    int found = 0;
    for (std::size_t at = text.find(part); at != text.npos; at = text.find(part, at + part.size()))
        ++found;
    return std::to_string(found) + " ";
}

void writeConfig(World& world, std::string_view content) {
    std::ofstream(world.store() / "config.xml", std::ios::binary | std::ios::trunc) << content;
}

}  // namespace vexa::test

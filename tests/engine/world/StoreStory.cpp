#include "engine/world/StoreStory.h"

#include <json/writer.h>

#include <algorithm>

namespace vexa::test {

using namespace std::chrono_literals;

namespace {

std::string element(const std::string& name, const std::string& text) {
    return "<" + name + ">" + text + "</" + name + ">";
}

std::string flag(bool value) {
    return value ? "true" : "false";
}

std::string stored(const StoredCredential& credential) {
    const std::string id = std::to_string(credential.id);
    const std::string secrets = credential.isTls
                                    ? element("cacert", "ca" + id) + element("clientcert", "cc")
                                    : element("username", "u" + id) + element("password", "p" + id);
    return element("credential",
                   element("id", id) + element("type", credential.isTls ? "eaptls" : "eapttls") +
                       "<accesstype>alluser</accesstype><creator>KORVANE-PC\\user</creator>" +
                       element("eap", credential.isTls ? "1" : "2") +
                       element("autoconnect", flag(credential.autoConnect)) +
                       element("credname", "name" + id) + element("realm", credential.realm) + secrets);
}

}  // namespace

std::string storing(const std::vector<StoredCredential>& credentials, const StoreOptions& options) {
    std::string all;
    std::string places;
    int place = 0;
    int next = 1;
    for (const StoredCredential& credential : credentials) {
        next = std::max(next, credential.id + 1);
        all += stored(credential);
        places += element("credential", element("id", std::to_string(credential.id)) +
                                            element("priority", std::to_string(++place)));
    }
    const std::string text =
        R"(<?xml version="1.0" encoding="UTF-8"?><configurations><global>)"
        "<dump_file_path>hs20log.txt</dump_file_path><create_new_dump_file>false</create_new_dump_file>" +
        element("autoconnect", flag(options.autoConnect)) + element("enabledump", flag(options.log)) +
        "<dumplevel>0</dumplevel>" + element("homerealm", options.homeRealm) +
        element("nextcredid", std::to_string(next)) + "</global>" + element("credentials", all) +
        "<users><user><username>KORVANE-PC\\user</username>" + element("credentials", places) +
        "</user></users></configurations>";
    return "\"config\":" + Json::valueToQuotedString(text.c_str());
}

std::string ttlsData(const std::string& realm, const std::string& members) {
    return R"({"CredentialEapMethod":2,"Type":1,"Username":"user","Password":"secret","RealName":")" + realm +
           "\"" + (members.empty() ? "" : ",") + members + "}";
}

std::string tlsData(const std::string& realm, const std::string& members) {
    return R"({"CredentialEapMethod":1,"Type":3,"CaCert":"ca","ClientCert":"client","RealName":")" + realm +
           "\"" + (members.empty() ? "" : ",") + members + "}";
}

std::string repeat(const std::string& text, std::size_t times) {
    std::string all;
    for (std::size_t i = 0; i < times; ++i)
        all += text;
    return all;
}

std::string list(World& world, const std::string& command, const std::string& data) {
    world.order(command, data);
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
    }
    return text;
}

}  // namespace vexa::test

#include "unit/config/StoreMachine.h"

#include <gtest/gtest.h>

#include <fstream>
#include <set>
#include <sstream>

namespace vexa::test {

namespace fs = std::filesystem;

StoreMachine::StoreMachine(const std::string& user) : m_machine("{'user':'" + user + "'}") {
    fs::create_directories(folder());
}

fs::path StoreMachine::folder() {
    return m_machine->folder() / "Public" / "Roaming" / "Korvane";
}

void StoreMachine::write(const std::string& name, std::string_view content) {
    std::ofstream(folder() / name, std::ios::binary | std::ios::trunc) << content;
}

std::string StoreMachine::read(const std::string& name) {
    const std::ifstream file(folder() / name, std::ios::binary);
    std::ostringstream content;
    content << file.rdbuf();
    return content.str();
}

std::string StoreMachine::listing() {
    std::set<std::string> names;
    for (const auto& entry : fs::directory_iterator(folder()))
        names.insert(entry.path().filename().string());
    std::string text;
    for (const std::string& name : names)
        text += (text.empty() ? "" : " ") + name;
    return text;
}

ResultCode StoreMachine::openWith(std::string_view content, bool* isChanged) {
    write("config.xml", content);
    return open(m_config, isChanged);
}

void StoreMachine::fail(const std::string& call, int skip, int times, int error) {
    m_machine.ask("{'do':'fail','call':'" + call + "','error':" + std::to_string(error) +
                  ",'skip':" + std::to_string(skip) + ",'times':" + std::to_string(times) + "}");
}

ResultCode StoreMachine::change(const std::function<void(CredentialTable&)>& change) {
    const auto held = m_config.beginChange();
    change(m_config.credentials());
    return m_config.saveConfig(held);
}

ResultCode StoreMachine::add(const std::wstring& realm) {
    return change([&](CredentialTable& table) {
        CredentialInput input;
        input.type = CRED_TYPE_EAP_TTLS;
        input.realm = realm;
        std::int32_t id = 0;
        EXPECT_EQ(table.addCredential(input, m_config.nextCredId(), m_config.userName(), id), kSuccess);
        m_config.advanceNextCredId();
    });
}

ResultCode open(Config& config, bool* isChanged) {
    const ResultCode result = config.initPaths();
    return result != kSuccess ? result : config.readConfig(isChanged);
}

std::string places(const CredentialTable& table) {
    std::string text;
    for (const Credential* credential : table.copyCredentialPointers())
        text += (text.empty() ? "" : " ") + std::to_string(credential->m_id) + ":" +
                std::to_string(credential->m_priority);
    return text;
}

std::string document(const std::string& credentials, const std::string& users, const std::string& global) {
    return "<?xml version=\"1.0\" encoding=\"UTF-8\"?><configurations><global>" + global +
           "</global><credentials>" + credentials + "</credentials><users>" + users +
           "</users></configurations>";
}

std::string saved(const std::string& credentials, const std::string& users, const std::string& global) {
    return "\xEF\xBB\xBF" + document(credentials, users, global);
}

std::string ttls(int id, const std::string& realm, const std::string& creator, const std::string& access) {
    return "<credential><id>" + std::to_string(id) + "</id><type>eapttls</type><accesstype>" + access +
           "</accesstype><creator>" + creator +
           "</creator><eap>2</eap><autoconnect>true</autoconnect><credname>" + realm + "</credname><realm>" +
           realm + "</realm><username>u</username><password>p</password></credential>";
}

std::string user(const std::string& name, const std::string& places) {
    std::string references;
    std::istringstream pairs(places);
    for (std::string pair; pairs >> pair;) {
        const std::size_t colon = pair.find(':');
        references += "<credential><id>" + pair.substr(0, colon) + "</id><priority>" +
                      pair.substr(colon + 1) + "</priority></credential>";
    }
    return "<user><username>" + name + "</username><credentials>" + references + "</credentials></user>";
}

}  // namespace vexa::test

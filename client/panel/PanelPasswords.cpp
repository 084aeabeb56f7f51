#include "client/panel/PanelPasswords.h"

#include <json/value.h>

#include "client/port/JsonLine.h"
#include "client/port/Passwords.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

constexpr const char* kId = "Id";
constexpr const char* kPassword = "Password";

}  // namespace

void PanelPasswords::take(const Event& event) {
    if (event.id != contract::kGetAllCredentialList) return;
    const Json::Value list = payloadOf(event);
    m_passwords.clear();
    if (!list.isArray()) return;
    for (const Json::Value& credential : list) {
        if (!credential.isObject() || !credential[kId].isInt64() || !credential[kPassword].isString())
            continue;
        m_passwords[credential[kId].asInt64()] = credential[kPassword].asString();
    }
}

std::optional<std::string> PanelPasswords::filledIn(const std::string& data) const {
    auto credential = parseJsonObject(data);
    if (!credential || credential->get(kPassword, "") != kHiddenPassword) return data;
    const Json::Value id = credential->get(kId, Json::Value());
    const auto found = id.isInt64() ? m_passwords.find(id.asInt64()) : m_passwords.end();
    if (found == m_passwords.end()) return std::nullopt;
    (*credential)[kPassword] = found->second;
    return jsonLine(*credential);
}

}  // namespace vexa::client

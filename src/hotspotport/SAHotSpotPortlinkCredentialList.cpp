#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "channel/StyledText.h"
#include "connection/Supplicant.h"
#include "contract/Ports.h"
#include "hotspotport/SAHotSpotPortlink.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

// The list follows every change of it, so it is written straight away, in the styled form.
class ObjectText {
public:
    explicit ObjectText(std::string& json) : m_json(json) {}

    void member(const char* name, std::int32_t number) { begin(name).append(std::to_string(number)); }
    void member(const char* name, bool flag) { begin(name).append(flag ? "true" : "false"); }
    void member(const char* name, const std::wstring& text) { appendQuoted(begin(name), utf8FromWide(text)); }
    void end() { m_json += "\n   }"; }

private:
    std::string& begin(const char* name) {
        m_json.append(m_isEmpty ? "   {\n      \"" : ",\n      \"").append(name).append("\" : ");
        m_isEmpty = false;
        return m_json;
    }

    std::string& m_json;
    bool m_isEmpty = true;
};

void appendCredential(std::string& json, const Credential& credential) {
    ObjectText object(json);
    object.member("AccessType", credential.m_accessType);
    object.member("AutoConnect", credential.m_bAutoConnect);
    object.member("CaCert", credential.m_caCert);
    object.member("ClientCert", credential.m_clientCert);
    object.member("Creator", credential.m_creator);
    object.member("CredentialEapMethod", credential.m_eapMethod);
    object.member("CredentialName", credential.m_credName);
    object.member("Id", credential.m_id);
    object.member("Password", credential.m_password);
    object.member("RealName", credential.m_realm);
    object.member("Type", credential.m_type);
    object.member("Username", credential.m_username);
    object.end();
}

}  // namespace

void SAHotSpotPortlink::SendCredentialList() {
    Log(3, "Send all credentials to vexa.");
    const auto supplicant = hotspotSupplicant(*this);
    if (!supplicant) return;
    const platform::LockGuard lock(g_hs20Lock);
    std::string text;
    for (const Credential* credential : supplicant->credentials().copyCredentialPointers()) {
        text += text.empty() ? "[\n" : ",\n";
        appendCredential(text, *credential);
    }
    text += text.empty() ? "null\n" : "\n]\n";
    SendData(text, contract::kGetAllCredentialList);
}

}  // namespace vexa

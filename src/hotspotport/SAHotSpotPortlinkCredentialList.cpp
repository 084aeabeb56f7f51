#include "base/DiagnosticLog.h"
#include "base/NetworkListLock.h"
#include "channel/Envelope.h"
#include "connection/Supplicant.h"
#include "contract/Ports.h"
#include "hotspotport/ListText.h"
#include "hotspotport/SAHotSpotPortlink.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

// What one takes in the event, with texts of usual length.
constexpr std::size_t kCredentialTextSize = 480;

void appendCredential(std::string& event, const Credential& credential) {
    ObjectText object(event);
    object.member("AccessType", credential.m_accessType);
    object.member("AutoConnect", credential.m_bAutoConnect);
    object.member("CaCert", utf8FromWide(credential.m_caCert));
    object.member("ClientCert", utf8FromWide(credential.m_clientCert));
    object.member("Creator", utf8FromWide(credential.m_creator));
    object.member("CredentialEapMethod", credential.m_eapMethod);
    object.member("CredentialName", utf8FromWide(credential.m_credName));
    object.member("Id", credential.m_id);
    object.member("Password", utf8FromWide(credential.m_password));
    object.member("RealName", utf8FromWide(credential.m_realm));
    object.member("Type", credential.m_type);
    object.member("Username", utf8FromWide(credential.m_username));
    object.end();
}

}  // namespace

void SAHotSpotPortlink::SendCredentialList() {
    Log(3, "Send all credentials to vexa.");
    const auto supplicant = hotspotSupplicant(*this);
    if (!supplicant) return;
    const platform::LockGuard lock(g_hs20Lock);
    const auto all = supplicant->credentials().copyCredentialPointers();
    SendEvent(buildEnvelope(contract::kGetAllCredentialList, contract::kHotspotSource,
                            all.size() * kCredentialTextSize, [&](std::string& event) {
                                appendListText(event, all, [&](const Credential& credential) {
                                    appendCredential(event, credential);
                                });
                            }));
}

}  // namespace vexa

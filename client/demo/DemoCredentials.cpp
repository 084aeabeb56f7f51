#include "client/demo/DemoCredentials.h"

#include "client/hotspot/CredentialStore.h"

namespace vexa::client {

namespace {

Credential userCredential(const char* name, const char* realm, const char* username) {
    Credential credential;
    credential.type = kTypeUser;
    credential.method = kMethodTtls;
    credential.access = kAllUsers;
    credential.autoConnect = true;
    credential.name = name;
    credential.realm = realm;
    credential.username = username;
    credential.password = "only for the demo";
    return credential;
}

Credential certificateCredential(const char* name, const char* realm, const char* certificate) {
    Credential credential;
    credential.type = kTypeCertificate;
    credential.method = kMethodTls;
    credential.access = kPerUser;
    credential.autoConnect = true;
    credential.name = name;
    credential.realm = realm;
    credential.clientCert = certificate;
    credential.caCert = "Roaming Root CA";
    return credential;
}

}  // namespace

// Each goes before those that are there, so that the last one has the highest priority.
CredentialList storeDemoCredentials(HotspotPort& port) {
    CredentialStore store(port);
    store.read();
    store.add(userCredential("City Wi-Fi", "city.example", "guest-4711"));
    store.add(userCredential("Airport Lounge", "lounge.example", "anna"));
    store.add(certificateCredential("Work", "corp.example", "anna@corp.example"));
    return store.list();
}

}  // namespace vexa::client

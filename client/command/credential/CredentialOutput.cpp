#include "client/command/credential/CredentialOutput.h"

namespace vexa::client {

FieldList credentialListFields() {
    return {{{"position", "Position"},
             {"id", "Id"},
             {"name", "Name"},
             {"realm", "Realm"},
             {"method", "Method"},
             {"access", "Access"},
             {"autoConnect", "Auto-connect"},
             {"creator", "Creator"},
             {"username", "User name"},
             {"clientCert", "Client certificate"},
             {"caCert", "CA certificate"},
             {"password", "Password"}}};
}

FieldList credentialChangeFields() {
    FieldList fields{{{"done", "Done"}}};
    for (const Field& field : credentialListFields().fields) {
        if (field.name != "password") fields.fields.push_back({"credential." + field.name, field.heading});
    }
    return fields;
}

}  // namespace vexa::client

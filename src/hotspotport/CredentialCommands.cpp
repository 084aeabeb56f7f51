#include "hotspotport/CredentialCommands.h"

#include <limits>

#include "connection/Supplicant.h"
#include "hotspotport/CredentialInputReader.h"
#include "hotspotport/SAHotSpotPortlink.h"

namespace vexa {

namespace {

// 0: the client leaves it to the store.
bool isKnownAccess(std::int32_t accessType) {
    return accessType == 0 || accessType == CRED_ACCESS_ALL_USER || accessType == CRED_ACCESS_PER_USER;
}

}  // namespace

bool addCredential(SAHotSpotPortlink& server, const Json::Value& data) {
    const auto input = readCredentialInput(data);
    if (!input || !isKnownAccess(input->accessType)) return false;
    const auto supplicant = hotspotSupplicant(server);
    if (supplicant) supplicant->addCredential(*input);
    return true;
}

bool deleteCredential(SAHotSpotPortlink& server, const Json::Value& data) {
    const auto id = readInteger(data, "Id");
    if (!id) return false;
    const auto supplicant = hotspotSupplicant(server);
    if (supplicant) supplicant->deleteCredential(*id);
    return true;
}

bool editCredential(SAHotSpotPortlink& server, const Json::Value& data) {
    auto input = readCredentialInput(data);
    const auto id = readInteger(data, "Id");
    if (!input || !id) return false;
    input->id = *id;
    const auto supplicant = hotspotSupplicant(server);
    if (*id != 0 && supplicant) supplicant->updateCredential(*input);
    return true;
}

// The client counts from 0, priorities count from 1.
bool setCredentialPosition(SAHotSpotPortlink& server, const Json::Value& data) {
    const auto id = readInteger(data, "Id");
    const auto order = readInteger(data, "Order");
    if (!id || !order || *order == std::numeric_limits<std::int32_t>::max()) return false;
    const auto supplicant = hotspotSupplicant(server);
    if (*id > 0 && supplicant) supplicant->setCredentialPosition(*id, *order + 1);
    return true;
}

}  // namespace vexa

#pragma once

#include <json/value.h>

namespace vexa {

class SAHotSpotPortlink;

// The commands that change credentials. False: `data` can't be read. Each changes the table of the adapter's
// Supplicant and writes the file before it returns; a refused change and a missing Supplicant change nothing.
// The caller answers with the list in every case.

bool addCredential(SAHotSpotPortlink& server, const Json::Value& data);
bool deleteCredential(SAHotSpotPortlink& server, const Json::Value& data);
bool editCredential(SAHotSpotPortlink& server, const Json::Value& data);
bool setCredentialPosition(SAHotSpotPortlink& server, const Json::Value& data);

}  // namespace vexa

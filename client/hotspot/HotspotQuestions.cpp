#include "client/hotspot/HotspotQuestions.h"

#include "client/hotspot/CredentialStore.h"
#include "client/hotspot/Fitting.h"
#include "client/machine/MachineRegistry.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

std::optional<bool> askFlag(HotspotPort& port, const char* name) {
    const auto isFlag = [](const Json::Value& payload) { return payload.isBool(); };
    const auto answer = port.question(name, isFlag);
    return answer.isAccepted ? std::optional(answer.payload->asBool()) : std::nullopt;
}

}  // namespace

std::optional<NetworkList> askNetworks(HotspotPort& port) {
    const auto answer = port.question(contract::kGetAllNetworkList, acceptsAny);
    return answer.payload ? std::optional(networkList(*answer.payload)) : std::nullopt;
}

bool askRadio(HotspotPort& port) {
    return askFlag(port, contract::kGetRadio).value_or(false);
}

std::optional<bool> askInternet(HotspotPort& port) {
    return askFlag(port, contract::kGetIsInternetAccess);
}

void requireRadio(HotspotPort& port) {
    if (!port.hasAdapter()) throw ClientError(kNoAdapter);
    if (!askRadio(port)) throw ClientError("the radio is off");
}

CredentialList askCredentials(HotspotPort& port) {
    return CredentialStore(port).read();
}

std::vector<std::string> credentialsOf(const Network& connected, const CredentialList& stored,
                                       const std::optional<MachineFolder>& machine) {
    return credentialsBehind(stored, connected, machine ? readConnectionMethod(*machine) : std::nullopt);
}

std::optional<bool> hotspotSwitch(const std::optional<MachineFolder>& machine) {
    return machine ? std::optional(readHotspotSwitch(*machine)) : std::nullopt;
}

}  // namespace vexa::client

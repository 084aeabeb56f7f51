#pragma once

#include <functional>

namespace vexa {

class Supplicant;

/// What the engine tells the client. Filled in by the client's server; without it nothing is told. Called
/// with the network list lock held.
struct ClientEvents {
    std::function<void(Supplicant& supplicant)> sendNetworkList;
    std::function<void()> sendDetectedHotspot;

    bool isComplete() const { return sendNetworkList && sendDetectedHotspot; }
};

}  // namespace vexa

#pragma once

#include <atomic>

#include "platform/WlanApi.h"

namespace vexa {

/// What the hotspot half knows of one adapter.
class Supplicant {
public:
    explicit Supplicant(const GUID& interfaceGuid) : m_interfaceGuid(interfaceGuid) {}

    const GUID m_interfaceGuid;
    std::atomic<bool> m_bRoaming{false};
};

}  // namespace vexa

#pragma once

#include <memory>
#include <utility>

#include "platform/WlanApi.h"

namespace vexa {

struct WlanMemoryDeleter {
    void operator()(void* memory) const { WlanFreeMemory(memory); }
};

/// Memory that the WLAN service gave out.
template <class T>
using WlanMemory = std::unique_ptr<T, WlanMemoryDeleter>;

/// What WlanQueryInterface answers, null if the query failed or the answer is shorter than `minimumSize`
/// bytes.
template <class T>
WlanMemory<T> queryInterface(HANDLE hWlan, const GUID& guid, WLAN_INTF_OPCODE opcode, DWORD minimumSize) {
    DWORD size = 0;
    PVOID data = nullptr;
    if (hWlan == nullptr) return nullptr;
    if (WlanQueryInterface(hWlan, &guid, opcode, nullptr, &size, &data, nullptr) != ERROR_SUCCESS)
        return nullptr;
    WlanMemory<T> answer(static_cast<T*>(data));
    return size < minimumSize ? nullptr : std::move(answer);
}

/// An answer about the radio holds one PHY at least.
inline constexpr DWORD kMinimumRadioState = sizeof(DWORD) + sizeof(WLAN_PHY_RADIO_STATE);

/// Whether the software radio of the first PHY is on; false also if the query fails.
inline bool isSoftwareRadioOn(HANDLE hWlan, const GUID& guid) {
    const auto radio =
        queryInterface<WLAN_RADIO_STATE>(hWlan, guid, wlan_intf_opcode_radio_state, kMinimumRadioState);
    return radio && radio->PhyRadioState[0].dot11SoftwareRadioState == dot11_radio_state_on;
}

}  // namespace vexa

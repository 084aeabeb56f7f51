#include "simulation/wlan/InterfaceQueries.h"

#include <algorithm>
#include <cstring>
#include <string_view>

#include "simulation/text/Wire.h"

namespace vexa::simulation {

namespace {

constexpr std::u16string_view kMakersDescription = u"Korvane Wireless Adapter";
constexpr std::u16string_view kOtherDescription = u"Wireless Adapter";

WLAN_INTERFACE_INFO interfaceInfo(Machine& machine, std::size_t adapter) {
    WLAN_INTERFACE_INFO info{};
    info.InterfaceGuid = machine.adapters().guid(adapter);
    const auto text = machine.adapters().isOfMaker(adapter) ? kMakersDescription : kOtherDescription;
    std::copy(text.begin(), text.end(), info.strInterfaceDescription);
    info.isState = machine.interfaceState(adapter);
    return info;
}

WLAN_RADIO_STATE radioState(Machine& machine, std::size_t adapter) {
    const RadioState radio = machine.adapters().radio(adapter);
    WLAN_RADIO_STATE state{};
    state.dwNumberOfPhys = 1;
    state.PhyRadioState[0] = {0, radio.software, radio.hardware};
    return state;
}

DWORD currentConnection(Machine& machine, std::size_t adapter, Bytes& answer) {
    Link link = machine.connections().shown(adapter);
    if (!isUp(link)) return ERROR_INVALID_STATE;
    link.state = machine.interfaceState(adapter);
    answer = connectionAttributes(link);
    return ERROR_SUCCESS;
}

}  // namespace

Bytes interfaceList(Machine& machine) {
    const auto adapters = machine.adapters().inserted();
    Bytes list(offsetof(WLAN_INTERFACE_INFO_LIST, InterfaceInfo) +
               adapters.size() * sizeof(WLAN_INTERFACE_INFO));
    const DWORD head[] = {static_cast<DWORD>(adapters.size()), 0};
    std::memcpy(list.data(), head, sizeof head);
    for (std::size_t i = 0; i < adapters.size(); ++i) {
        const WLAN_INTERFACE_INFO info = interfaceInfo(machine, adapters[i]);
        std::memcpy(list.data() + sizeof head + i * sizeof info, &info, sizeof info);
    }
    return list;
}

DWORD queryInterfaceValue(Machine& machine, std::size_t adapter, WLAN_INTF_OPCODE opcode, Bytes& answer) {
    switch (opcode) {
        case wlan_intf_opcode_radio_state:
            answer = bytesOf(radioState(machine, adapter));
            return ERROR_SUCCESS;
        case wlan_intf_opcode_interface_state:
            answer = bytesOf(machine.interfaceState(adapter));
            return ERROR_SUCCESS;
        case wlan_intf_opcode_channel_number:
            answer = bytesOf(channelInUse(machine.connections().shown(adapter)));
            return ERROR_SUCCESS;
        case wlan_intf_opcode_current_connection:
            return currentConnection(machine, adapter, answer);
        default:
            return ERROR_INVALID_PARAMETER;
    }
}

}  // namespace vexa::simulation

#include "base/WlanMemory.h"
#include "protocol/JsonText.h"
#include "protocol/SAHotSpotPortlink.h"

namespace vexa {

void SAHotSpotPortlink::SendRadioState() {
    const bool isOn = isSoftwareRadioOn(m_hClientHandle, m_interfaceGuid.get());
    SendData(toStyledText(Json::Value(isOn)), "GET_RADIO");
}

void SAHotSpotPortlink::SendCardState() {
    SendData("", m_bCardIn ? "CARD_PLUG_IN" : "CARD_PLUG_OUT");
}

}  // namespace vexa

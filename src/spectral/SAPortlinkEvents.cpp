#include "base/StandardOutput.h"
#include "base/WlanMemory.h"
#include "channel/Envelope.h"
#include "channel/JsonText.h"
#include "spectral/SAPortlink.h"

namespace vexa {

std::string SAPortlink::BuildEventText(const std::string& eventId) {
    return buildEnvelope(eventId, kSpectralSource);
}

void SAPortlink::SendRadioState() {
    Send(BuildEventText(isSoftwareRadioOn(m_hWlan.get(), m_interfaceGuid.get()) ? "RADIO_ON" : "RADIO_OFF"));
}

void SAPortlink::SendCurrentChannel() {
    const int channel = HandleCommand(kQueryChannel)[3];
    printToStandardOutput("CurrentChannel=%d\n", channel);
    const std::string text =
        buildEnvelope("SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA", kSpectralSource, std::to_string(channel));
    const bool isSent = IpcSend(m_hIpc, text.data(), static_cast<std::uint32_t>(text.size())) != 0;
    printToStandardOutput(isSent ? "Service send CurrentChannelData success!\n"
                                 : "Service send CurrentChannelData fail!\n");
}

void SAPortlink::SendSampleEvent(int order, int value, const char* eventId, const char* valueName) {
    Json::Value sample;
    sample["order"] = order;
    sample[valueName] = value;
    Send(buildEnvelope(eventId, kSpectralSource, toStyledText(sample)));
}

}  // namespace vexa

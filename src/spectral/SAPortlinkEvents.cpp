#include "base/StandardOutput.h"
#include "base/WlanMemory.h"
#include "channel/Envelope.h"
#include "channel/StyledText.h"
#include "contract/Ports.h"
#include "spectral/SAPortlink.h"

namespace vexa {

std::string SAPortlink::BuildEventText(const std::string& eventId) {
    return buildEnvelope(eventId, contract::kSpectralSource);
}

void SAPortlink::SendRadioState() {
    Send(BuildEventText(isSoftwareRadioOn(m_hWlan.get(), m_interfaceGuid.get()) ? contract::kRadioOn
                                                                                : contract::kRadioOff));
}

void SAPortlink::SendCurrentChannel() {
    const int channel = HandleCommand(kQueryChannel)[3];
    printToStandardOutput("CurrentChannel=%d\n", channel);
    const std::string text =
        buildEnvelope(contract::kCurrentChannelData, contract::kSpectralSource, std::to_string(channel));
    const bool isSent = IpcSend(m_hIpc, text.data(), static_cast<std::uint32_t>(text.size())) != 0;
    printToStandardOutput(isSent ? "Service send CurrentChannelData success!\n"
                                 : "Service send CurrentChannelData fail!\n");
}

void SAPortlink::SendSampleEvent(int order, int value, const char* eventId, const char* valueName) {
    Json::Value sample;
    sample["order"] = order;
    sample[valueName] = value;
    Send(buildEnvelope(eventId, contract::kSpectralSource, toStyledText(sample)));
}

}  // namespace vexa

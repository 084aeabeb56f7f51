#include <algorithm>

#include "channel/Envelope.h"
#include "channel/JsonText.h"
#include "contract/Ports.h"
#include "spectral/SAPortlink.h"

namespace vexa {

namespace {

using platform::LockGuard;

}  // namespace

// An adapter that is gone, a module that fails and an answer that is cut short leave the channels as they
// were known.
void SAPortlink::QueryChannelList() {
    const LockGuard lock(m_cs);
    updateCardState();
    if (!m_bCardIn || m_hClientHandle.get() == nullptr) return;

    std::vector<std::byte> buffer = channelListRequest();
    const auto size = static_cast<DWORD>(buffer.size());
    const GUID guid = m_interfaceGuid.get();
    DWORD returned = 0;
    if (WlanIhvControl(m_hWlan.get(), &guid, wlan_ihv_control_type_driver, size, buffer.data(), size,
                       buffer.data(), &returned) != ERROR_SUCCESS)
        return;

    buffer.resize(std::min<std::size_t>(returned, buffer.size()));
    const auto channels = parseChannelList(buffer);
    if (!channels) return;
    m_channelOrder = orderChannels(*channels);
    for (std::vector<int>* table : {&m_congestion, &m_noise, &m_lastCongestion, &m_lastNoise})
        table->assign(m_channelOrder.size(), 0);
}

void SAPortlink::SendChannelList() {
    QueryChannelList();
    Json::Value channels;
    {
        const LockGuard lock(m_cs);
        for (const auto& [channel, order] : m_channelOrder) {
            Json::Value entry;
            entry["Channel"] = channel;
            entry["Order"] = order;
            channels.append(entry);
        }
    }
    Send(buildEnvelope(contract::kChannelListData, contract::kSpectralSource, toStyledText(channels)));
}

}  // namespace vexa

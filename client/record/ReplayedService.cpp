#include "client/record/ReplayedService.h"

#include <json/value.h>

#include <array>

#include "contract/Ports.h"
#include "text/OneOf.h"

namespace vexa::client {

namespace {

using namespace contract;
using Answer = ReplayedService::Answer;

constexpr std::array kCredentialChanges{kAddCredential, kEditCredential, kDeleteCredential,
                                        kSetPositionCredential};
constexpr std::array kOtherChanges{kConnectNetwork, kDisconnectNetwork, kSetHotspotAutoConnect,
                                   kUpdateNetworkRealm, kReadCredentialFromFile};
constexpr std::array kWholes{kGetAllNetworkList, kGetAllCredentialList, kGetIsInternetAccess,
                             kChannelListData, kCurrentChannelData};

std::optional<bool> asFlag(const Json::Value& payload) {
    return payload.isBool() ? std::optional(payload.asBool()) : std::nullopt;
}

const char* flagText(bool flag) {
    return flag ? "true\n" : "false\n";
}

}  // namespace

void ReplayedService::take(const RecordedEvent& recorded) {
    const Event& event = recorded.event;
    if (event.id == kCardPlugIn || event.id == kCardPlugOut) m_known.cardIn = event.id == kCardPlugIn;
    if (event.id == kRadioOn || event.id == kRadioOff) m_known.radio = event.id == kRadioOn;
    if (event.id == kGetRadio) m_known.softwareRadio = asFlag(payloadOf(event));
    if (event.id == kSetHotspotAutoConnect) m_known.isEnabled = asFlag(payloadOf(event));
    if (event.id == kSampleDataCongestion || event.id == kSampleDataInterference) takeSample(event);
    if (!isOneOf(kWholes, event.id)) return;
    // The orders of another list mean other channels.
    if (event.id == kChannelListData && m_known.data[event.id] != event.data) m_known.samples.clear();
    m_known.data[event.id] = event.data;
}

void ReplayedService::takeSample(const Event& event) {
    const Json::Value sample = payloadOf(event);
    if (sample.isObject() && sample["order"].isInt())
        m_known.samples[{event.id, sample["order"].asInt()}] = event.data;
}

void ReplayedService::foresee(const RecordedEvent& recorded) {
    ReplayedService later;
    later.take(recorded);
    const auto complete = [](auto& known, const auto& foreseen) {
        if (!known) known = foreseen;
    };
    complete(m_known.cardIn, later.m_known.cardIn);
    complete(m_known.radio, later.m_known.radio);
    complete(m_known.softwareRadio, later.m_known.softwareRadio);
    m_known.data.merge(later.m_known.data);
}

Answer ReplayedService::answer(RecordedPort port, const std::string& command) const {
    return port == RecordedPort::Spectral ? answerSpectral(command) : answerHotspot(command);
}

// A scan needs no answer: the values of the recording come by themselves.
Answer ReplayedService::answerSpectral(const std::string& command) const {
    if (command == kGetChannelList) return {channelList()};
    if (command != kGetCurrentChannel) return {};
    auto events = held(kCurrentChannelData, false);
    if (events.empty()) events.push_back({kCurrentChannelData, "0", kSpectralSource});
    return {events};
}

// With the values that are known then, which the service would measure anew.
std::vector<Event> ReplayedService::channelList() const {
    const bool isOn = m_known.softwareRadio.value_or(m_known.radio.value_or(true));
    std::vector<Event> events{{isOn ? kRadioOn : kRadioOff, "", kSpectralSource}};
    const auto list = held(kChannelListData, false);
    events.insert(events.end(), list.begin(), list.end());
    if (list.empty()) events.push_back({kChannelListData, "null\n", kSpectralSource});
    for (const auto& [key, data] : m_known.samples)
        events.push_back({key.first, data, kSpectralSource});
    return events;
}

Answer ReplayedService::answerHotspot(const std::string& command) const {
    if (command == kGetIsCardIn)
        return {{{m_known.cardIn.value_or(false) ? kCardPlugIn : kCardPlugOut, "", kHotspotSource}}};
    if (command == kGetRadio)
        return {{{kGetRadio, flagText(m_known.softwareRadio.value_or(true)), kHotspotSource}}};
    if (command == kGetAllNetworkList || command == kGetIsInternetAccess || command == kGetAllCredentialList)
        return {held(command, true)};
    // As the service tells that a change came to nothing.
    if (isOneOf(kCredentialChanges, command)) return {held(kGetAllCredentialList, true), true};
    if (command == kConnectNetwork) return {{{kConnectDisconnect, "0\n", kHotspotSource}}, true};
    if (command == kSetHotspotAutoConnect)
        return {{{command, flagText(m_known.isEnabled.value_or(true)), kHotspotSource}}, true};
    return {{}, isOneOf(kOtherChanges, command)};
}

std::vector<Event> ReplayedService::held(const std::string& event, bool needsCard) const {
    const auto found = m_known.data.find(event);
    if (found == m_known.data.end() || (needsCard && !m_known.cardIn.value_or(false))) return {};
    const bool isSpectral = event == kChannelListData || event == kCurrentChannelData;
    return {{event, found->second, isSpectral ? kSpectralSource : kHotspotSource}};
}

}  // namespace vexa::client

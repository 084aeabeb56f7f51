#include "client/record/SpectrumScenario.h"

#include <algorithm>

namespace vexa::client {

namespace {

using Change = SpectralView::Change;

// The values of one scan come in one burst.
constexpr RecordedTime kOneScan{200};
constexpr int kFullLevel = 100;

// Samples whose bins are all alike are told as 7 more than their power.
constexpr int kInterferenceOfPowerZero = 7;

// The service smooths a congestion and rounds it down at each scan: from below it stays one short of a level.
int levelFor(int before, int congestion) {
    return std::min(before > 0 && congestion > before ? congestion + 1 : congestion, kFullLevel);
}

}  // namespace

void SpectrumScenario::take(const RecordedEvent& recorded) {
    if (recorded.port != RecordedPort::Spectral) return;
    const auto update = m_view.apply(recorded.event);
    if (update.change == Change::ChannelList) takeList();
    if (update.change == Change::Congestion || update.change == Change::Interference)
        takeSample(recorded.at, update);
}

// The adapter's own list: in the order of the orders.
void SpectrumScenario::takeList() {
    auto listed = m_view.channels();
    if (listed.empty()) return;
    std::sort(listed.begin(), listed.end(), [](const auto& a, const auto& b) { return a.order < b.order; });
    Json::Value channels(Json::arrayValue);
    for (const auto& channel : listed)
        channels.append(channel.number);
    m_isOtherList = m_isOtherList || (!m_channels.isNull() && m_channels != channels);
    if (m_channels.isNull()) m_channels = std::move(channels);
}

void SpectrumScenario::takeSample(RecordedTime at, const SpectralView::Update& update) {
    const auto number = m_view.numberOf(update.order);
    if (!number) return;
    const bool isNew = m_levels.empty() || at - m_levels.rbegin()->first > kOneScan;
    Json::Value& level = (isNew ? m_levels[at] : m_levels.rbegin()->second)[std::to_string(*number)];
    if (update.change == Change::Interference) {
        level["power"] = update.value - kInterferenceOfPowerZero;
        return;
    }
    level["congestion"] = levelFor(m_congestion[*number], update.value);
    m_congestion[*number] = update.value;
}

void SpectrumScenario::write(Json::Value& scenario, ScenarioTimeline& timeline, ScenarioNotes& notes) const {
    if (m_channels.isNull()) {
        notes.emplace_back("unknown: the spectrum, as no channel was told; scans fail");
        return;
    }
    Json::Value& spectrum = scenario["spectrum"];
    spectrum["channels"] = m_channels;
    for (const Json::Value& channel : m_channels) {
        Json::Value& level = spectrum["levels"][std::to_string(channel.asInt())];
        level["congestion"] = 0;
        level["power"] = -kInterferenceOfPowerZero;
        level["spread"] = 0;
    }
    for (const auto& [at, levels] : m_levels)
        timeline.add(at, "levels")["levels"] = levels;
    if (m_isOtherList) notes.emplace_back("left out: other lists of channels than the first");
    if (m_levels.empty())
        notes.emplace_back("unknown: the spectrum's values, as no scan was running; all channels are silent");
    else
        notes.emplace_back(
            "approximated: the spectrum's values come by flat samples and scans of 400 ms; a congestion gets "
            "to its value within some scans");
}

}  // namespace vexa::client

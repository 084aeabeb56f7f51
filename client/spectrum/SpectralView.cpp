#include "client/spectrum/SpectralView.h"

#include <json/value.h>

#include <algorithm>

#include "client/port/JsonLine.h"
#include "contract/Ports.h"

namespace vexa::client {

SpectralView::Update SpectralView::apply(const Event& event) {
    ++m_eventCount;
    if (event.id == contract::kSampleDataCongestion) {
        return applySample(event.data, "congestion_value", &Values::congestion, Change::Congestion);
    }
    if (event.id == contract::kSampleDataInterference) {
        return applySample(event.data, "noise_value", &Values::interference, Change::Interference);
    }
    if (event.id == contract::kChannelListData) return applyChannelList(event.data);
    if (event.id == contract::kRadioOn || event.id == contract::kRadioOff) {
        m_radioOn = event.id == contract::kRadioOn;
        return {Change::Radio};
    }
    if (event.id == contract::kCardPlugIn || event.id == contract::kCardPlugOut) {
        m_cardIn = event.id == contract::kCardPlugIn;
        return {Change::Card};
    }
    return {};
}

SpectralView::Update SpectralView::applyChannelList(const std::string& data) {
    const auto list = parseJson(data);
    if (!list || !(list->isArray() || list->isNull())) return {};
    std::vector<Listed> listed;
    for (const Json::Value& entry : *list) {
        if (!entry.isObject() || !entry["Channel"].isInt() || !entry["Order"].isInt()) return {};
        listed.push_back({entry["Channel"].asInt(), entry["Order"].asInt()});
    }
    // Values speak of orders. Those that came before the first list belong to it; another list makes them
    // void.
    if (m_hasChannelList && listed != m_listed) m_values.clear();
    m_listed = std::move(listed);
    m_hasChannelList = true;
    return {Change::ChannelList};
}

SpectralView::Update SpectralView::applySample(const std::string& data, const char* valueName,
                                               std::optional<int> Values::*value, Change change) {
    const auto sample = parseJsonObject(data);
    if (!sample || !(*sample)["order"].isInt() || !(*sample)[valueName].isInt()) return {};
    const Update update{change, (*sample)["order"].asInt(), (*sample)[valueName].asInt()};
    m_values[update.order].*value = update.value;
    m_values[update.order].isCurrent = m_hasChannelList;
    return update;
}

std::vector<SpectralView::Channel> SpectralView::channels() const {
    std::vector<Channel> result;
    for (const Listed& listed : m_listed) {
        const auto found = m_values.find(listed.order);
        const Values values = found == m_values.end() ? Values() : found->second;
        result.push_back(
            {listed.number, listed.order, values.congestion, values.interference, values.isCurrent});
    }
    return result;
}

std::optional<SpectralView::Channel> SpectralView::busiest() const {
    std::optional<Channel> result;
    for (const Channel& channel : channels()) {
        if (channel.congestion && (!result || *channel.congestion > *result->congestion)) result = channel;
    }
    return result;
}

std::size_t SpectralView::knownChannels() const {
    const auto all = channels();
    return static_cast<std::size_t>(
        std::count_if(all.begin(), all.end(), [](const Channel& channel) { return channel.isKnown(); }));
}

std::size_t SpectralView::currentChannels() const {
    const auto all = channels();
    return static_cast<std::size_t>(
        std::count_if(all.begin(), all.end(), [](const Channel& channel) { return channel.isCurrent; }));
}

std::optional<int> SpectralView::numberOf(int order) const {
    const auto found = std::find_if(m_listed.begin(), m_listed.end(),
                                    [order](const Listed& listed) { return listed.order == order; });
    if (found == m_listed.end()) return std::nullopt;
    return found->number;
}

}  // namespace vexa::client

#include "client/spectrum/SpectralText.h"

#include <iomanip>
#include <sstream>

#include "client/port/JsonLine.h"
#include "client/terminal/Text.h"
#include "contract/Ports.h"

namespace vexa::client {

namespace {

using Change = SpectralView::Change;

std::string describeSample(const SpectralView::Update& update, const SpectralView& view,
                           const char* quantity) {
    const auto number = view.numberOf(update.order);
    std::string line = number ? "channel " : "order ";
    line += std::to_string(number.value_or(update.order));
    return line + ": " + quantity + " " + std::to_string(update.value);
}

std::string describeChannels(const SpectralView& view) {
    std::string line = counted(view.channels().size(), "channel") + ":";
    for (const auto& channel : view.channels()) {
        line += ' ';
        line += std::to_string(channel.number);
    }
    return line;
}

std::string valueText(const SpectralView::Channel& channel, std::optional<int> value) {
    const auto certain = channel.certain(value);
    return certain ? std::to_string(*certain) : "-";
}

Json::Value valueJson(const SpectralView::Channel& channel, std::optional<int> value) {
    const auto certain = channel.certain(value);
    return certain ? Json::Value(*certain) : Json::Value();
}

}  // namespace

std::string describeEvent(const Event& event, const SpectralView::Update& update, const SpectralView& view) {
    switch (update.change) {
        case Change::Radio:
            return view.radioOn().value_or(false) ? "radio on" : "radio off";
        case Change::Card:
            return view.cardIn().value_or(false) ? "adapter in" : "adapter out";
        case Change::ChannelList:
            return describeChannels(view);
        case Change::Congestion:
            return describeSample(update, view, "congestion");
        case Change::Interference:
            return describeSample(update, view, "interference");
        case Change::None:
            break;
    }
    if (event.id == contract::kCurrentChannelData)
        return event.data == "0" ? "connected on no channel" : "connected on channel " + event.data;
    return printable(event.data.empty() ? event.id : event.id + " " + event.data);
}

std::vector<std::string> spectrumTable(const SpectralView& view) {
    std::vector<std::string> lines{"Channel  Congestion  Interference"};
    for (const auto& channel : view.channels()) {
        std::ostringstream line;
        line << std::setw(7) << channel.number << std::setw(12) << valueText(channel, channel.congestion)
             << std::setw(14) << valueText(channel, channel.interference);
        lines.push_back(line.str());
    }
    return lines;
}

Json::Value spectrumJson(const SpectralView& view) {
    Json::Value channels(Json::arrayValue);
    for (const auto& channel : view.channels()) {
        Json::Value entry(Json::objectValue);
        entry["channel"] = channel.number;
        entry["order"] = channel.order;
        entry["congestion"] = valueJson(channel, channel.congestion);
        entry["interference"] = valueJson(channel, channel.interference);
        channels.append(entry);
    }
    Json::Value object(Json::objectValue);
    object["channels"] = channels;
    return object;
}

std::string summaryText(const SpectralView& view) {
    const auto busiest = view.busiest();
    return "Seen: " + counted(view.channels().size(), "channel") + ", " +
           counted(view.eventCount(), "event") + ", " +
           (busiest ? "busiest channel " + std::to_string(busiest->number) + " (congestion " +
                          std::to_string(*busiest->congestion) + ")"
                    : "no congestion on any channel");
}

Json::Value summaryJson(const SpectralView& view) {
    Json::Value object(Json::objectValue);
    object["channels"] = static_cast<Json::UInt64>(view.channels().size());
    object["events"] = static_cast<Json::UInt64>(view.eventCount());
    object["busiest"] = Json::nullValue;
    if (const auto busiest = view.busiest()) {
        object["busiest"] = Json::objectValue;
        object["busiest"]["channel"] = busiest->number;
        object["busiest"]["congestion"] = *busiest->congestion;
    }
    return object;
}

}  // namespace vexa::client

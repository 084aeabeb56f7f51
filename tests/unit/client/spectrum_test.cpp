#include <gtest/gtest.h>

#include "client/port/JsonLine.h"
#include "client/spectrum/SpectralPicture.h"
#include "client/spectrum/SpectralText.h"
#include "client/spectrum/SpectralView.h"

namespace vexa::client {
namespace {

using Change = SpectralView::Change;

constexpr const char* kTwoChannels = R"([{"Channel": 1, "Order": 2}, {"Channel": 36, "Order": 1}])";

Event channelList(const std::string& json) {
    return {"SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G", json};
}

Event congestion(int order, int value) {
    return {"SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION",
            R"({"congestion_value":)" + std::to_string(value) + R"(,"order":)" + std::to_string(order) + "}"};
}

Event interference(int order, int value) {
    return {"SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE",
            R"({"noise_value":)" + std::to_string(value) + R"(,"order":)" + std::to_string(order) + "}"};
}

SpectralView viewOf(const std::vector<Event>& events) {
    SpectralView view;
    for (const Event& event : events)
        view.apply(event);
    return view;
}

// A channel as "number:congestion/interference".
std::string values(const SpectralView& view) {
    const auto text = [](std::optional<int> value) { return value ? std::to_string(*value) : "-"; };
    std::string all;
    for (const auto& channel : view.channels())
        all += (all.empty() ? "" : " ") + std::to_string(channel.number) + ":" + text(channel.congestion) +
               "/" + text(channel.interference);
    return all;
}

TEST(SpectralView, ValuesGoToTheChannelOfTheirOrder) {
    const Event list = channelList(kTwoChannels);
    const std::tuple<const char*, std::vector<Event>, const char*> cases[] = {
        {"one of each", {list, congestion(1, 70), interference(2, 55)}, "1:-/55 36:70/-"},
        {"a later one", {list, congestion(1, 70), congestion(1, 0)}, "1:-/- 36:0/-"},
        {"one before the list", {congestion(1, 70), list}, "1:-/- 36:70/-"},
        {"none without a list", {congestion(1, 70)}, ""},
        {"the same list again", {list, congestion(1, 70), list}, "1:-/- 36:70/-"},
        {"another list", {list, congestion(1, 70), channelList(R"([{"Channel": 6, "Order": 1}])")}, "6:-/-"},
        {"a list that is null", {list, channelList("null\n")}, ""},
    };
    for (const auto& [what, events, wanted] : cases)
        EXPECT_EQ(values(viewOf(events)), wanted) << what;
    EXPECT_FALSE(viewOf({congestion(1, 70)}).hasChannelList());
    EXPECT_TRUE(viewOf({channelList("null\n")}).hasChannelList());
}

TEST(SpectralView, MalformedPayloadsChangeNothing) {
    SpectralView view = viewOf({channelList(kTwoChannels)});
    for (const Event& event :
         {channelList("nonsense"), channelList("{}"), channelList("[7]"), channelList(R"([{"Channel": 1}])"),
          channelList(std::string(100000, '[')), Event{"SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION", ""},
          Event{"SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION", R"({"order": 1})"},
          Event{"SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION", R"({"order": "1", "congestion_value": 2})"},
          Event{"SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE", R"({"order": 1, "congestion_value": 2})"}})
        EXPECT_EQ(view.apply(event).change, Change::None) << event.id << " " << event.data;
    EXPECT_EQ(values(view), "1:-/- 36:-/-");
    EXPECT_EQ(view.knownChannels(), 0U);
}

TEST(SpectralView, TheBusiestChannelIsTheLowestOfTheHighest) {
    SpectralView view =
        viewOf({channelList(R"([{"Channel":1,"Order":3},{"Channel":6,"Order":2},{"Channel":11,"Order":1}])"),
                interference(1, 100)});
    EXPECT_FALSE(view.busiest());
    view.apply(congestion(3, 20));
    view.apply(congestion(1, 40));
    EXPECT_EQ(view.busiest()->number, 11);
    view.apply(congestion(2, 40));
    EXPECT_EQ(view.busiest()->number, 6);
}

TEST(SpectralText, EveryEventIsALine) {
    SpectralView view;
    const std::pair<Event, const char*> steps[] = {
        {congestion(2, 9), "order 2: congestion 9"},
        {channelList(kTwoChannels), "2 channels: 1 36"},
        {congestion(2, 9), "channel 1: congestion 9"},
        {interference(1, 100), "channel 36: interference 100"},
        {{"RADIO_ON", ""}, "radio on"},
        {{"RADIO_OFF", ""}, "radio off"},
        {{"CARD_PLUG_IN", ""}, "adapter in"},
        {{"CARD_PLUG_OUT", ""}, "adapter out"},
        {{"SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA", "36"}, "connected on channel 36"},
        {{"NEWS", ""}, "NEWS"},
    };
    for (const auto& [event, line] : steps) {
        const auto update = view.apply(event);
        EXPECT_EQ(describeEvent(event, update, view), line);
    }
}

TEST(SpectralText, AValueThatDidNotChangeSinceTheListIs0AndAnyOtherThatWasNotToldIsNone) {
    const SpectralView view = viewOf({interference(2, 7), channelList(kTwoChannels), interference(1, 42)});
    EXPECT_EQ(spectrumTable(view), (std::vector<std::string>{"Channel  Congestion  Interference",
                                                             "      1           -             7",
                                                             "     36           0            42"}));
    EXPECT_EQ(jsonLine(spectrumJson(view)),
              R"({"channels":[{"channel":1,"congestion":null,"interference":7,"order":2},)"
              R"({"channel":36,"congestion":0,"interference":42,"order":1}]})");
    EXPECT_EQ(spectrumTable(viewOf({channelList(kTwoChannels)}))[1], "      1           -             -");
}

TEST(SpectralText, TheSummaryNamesTheBusiestChannel) {
    SpectralView view;
    EXPECT_EQ(summaryText(view), "Seen: 0 channels, 0 events, no congestion on any channel");
    EXPECT_EQ(jsonLine(summaryJson(view)), R"({"busiest":null,"channels":0,"events":0})");
    view = viewOf({channelList(kTwoChannels), congestion(1, 42)});
    EXPECT_EQ(summaryText(view), "Seen: 2 channels, 2 events, busiest channel 36 (congestion 42)");
    EXPECT_EQ(jsonLine(summaryJson(view)),
              R"({"busiest":{"channel":36,"congestion":42},"channels":2,"events":2})");
}

// The picture of one channel; 42 columns leave bars of 10.
std::vector<std::string> picture(int congestionValue, int interferenceValue, const PictureStyle& style) {
    return drawSpectrum(viewOf({channelList(R"([{"Channel": 36, "Order": 1}])"),
                                congestion(1, congestionValue), interference(1, interferenceValue)}),
                        style);
}

TEST(SpectralPicture, BarsAreAsLongAsTheirValues) {
    const std::pair<int, const char*> rows[] = {{9, "          "}, {10, "#         "}, {99, "######### "}};
    for (const auto& [value, bar] : rows)
        EXPECT_EQ(picture(value, 20, {42, false, false}).at(2).substr(9, 10), bar) << value;
    const auto lines = picture(30, 100, {42, false, false});
    EXPECT_EQ(lines[0], "1 channel, 3 events");
    EXPECT_EQ(lines[2], "     36  ###         30  ########## 100");
    EXPECT_NE(picture(35, 0, {42, false, true})[2].find("███▌······  35"), std::string::npos);
    for (const int columns : {40, 80, 81, 120, 300})
        for (const std::string& line : picture(100, 100, {columns, false, false}))
            EXPECT_LT(line.size(), static_cast<std::size_t>(columns));
}

TEST(SpectralPicture, TheColourGoesWithTheValueAndIsEndedInEveryRow) {
    const std::pair<int, const char*> rows[] = {
        {39, "\033[32m"}, {40, "\033[33m"}, {69, "\033[33m"}, {70, "\033[31m"}};
    for (const auto& [value, colour] : rows) {
        const std::string line = picture(value, 1, {42, true, false})[2];
        EXPECT_EQ(line.substr(9, 5), colour) << value;
        EXPECT_LT(line.rfind("\033[3"), line.rfind("\033[0m"));
    }
    EXPECT_EQ(picture(80, 80, {120, false, true})[2].find('\033'), std::string::npos);
}

}  // namespace
}  // namespace vexa::client

#include <gtest/gtest.h>

#include "client/port/JsonLine.h"

#include "client/spectrum/SpectralText.h"
#include "unit/client/spectral_events.h"

namespace vexa::client {
namespace {

std::string told(SpectralView& view, const Event& event) {
    const auto update = view.apply(event);
    return describeEvent(event, update, view);
}

TEST(SpectralText, EveryEventIsALine) {
    SpectralView view;
    EXPECT_EQ(told(view, congestion(2, 9)), "order 2: congestion 9");
    EXPECT_EQ(told(view, channelList(kTwoChannels)), "2 channels: 1 36");
    EXPECT_EQ(told(view, congestion(2, 9)), "channel 1: congestion 9");
    EXPECT_EQ(told(view, interference(1, 100)), "channel 36: interference 100");
    EXPECT_EQ(told(view, {"RADIO_ON", ""}), "radio on");
    EXPECT_EQ(told(view, {"RADIO_OFF", ""}), "radio off");
    EXPECT_EQ(told(view, {"CARD_PLUG_IN", ""}), "adapter in");
    EXPECT_EQ(told(view, {"CARD_PLUG_OUT", ""}), "adapter out");
    EXPECT_EQ(told(view, {"SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA", "36"}), "connected on channel 36");
    EXPECT_EQ(told(view, {"NEWS", ""}), "NEWS");
}

TEST(SpectralText, AValueThatDidNotChangeIs0AndASilentChannelHasNone) {
    SpectralView view;
    view.apply(channelList(kTwoChannels));
    view.apply(interference(1, 42));
    EXPECT_EQ(spectrumTable(view), (std::vector<std::string>{"Channel  Order  Congestion  Interference",
                                                             "      1      2           -             -",
                                                             "     36      1           0            42"}));
    EXPECT_EQ(spectrumJson(view),
              R"({"channels":[{"channel":1,"congestion":null,"interference":null,"order":2},)"
              R"({"channel":36,"congestion":0,"interference":42,"order":1}]})");
}

TEST(SpectralText, TheSummaryNamesTheBusiestChannel) {
    SpectralView view;
    EXPECT_EQ(summaryText(view), "Seen: 0 channels, 0 events, no congestion on any channel");
    EXPECT_EQ(jsonLine(summaryJson(view)), R"({"busiest":null,"channels":0,"events":0})");
    view.apply(channelList(kTwoChannels));
    view.apply(congestion(1, 42));
    EXPECT_EQ(summaryText(view), "Seen: 2 channels, 2 events, busiest channel 36 (congestion 42)");
    EXPECT_EQ(jsonLine(summaryJson(view)),
              R"({"busiest":{"channel":36,"congestion":42},"channels":2,"events":2})");
}

}  // namespace
}  // namespace vexa::client

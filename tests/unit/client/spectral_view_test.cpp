#include <gtest/gtest.h>

#include "client/spectrum/SpectralView.h"
#include "unit/client/spectral_events.h"

namespace vexa::client {
namespace {

using Change = SpectralView::Change;

TEST(SpectralView, ValuesGoToTheChannelOfTheirOrder) {
    SpectralView view;
    EXPECT_EQ(view.apply(channelList(kTwoChannels)).change, Change::ChannelList);
    EXPECT_EQ(view.apply(congestion(1, 70)).change, Change::Congestion);
    EXPECT_EQ(view.apply(interference(2, 55)).change, Change::Interference);

    const auto channels = view.channels();
    ASSERT_EQ(channels.size(), 2U);
    EXPECT_EQ(channels[0].number, 1);
    EXPECT_EQ(channels[0].interference, 55);
    EXPECT_FALSE(channels[0].congestion);
    EXPECT_EQ(channels[1].number, 36);
    EXPECT_EQ(channels[1].congestion, 70);
    EXPECT_EQ(view.eventCount(), 3U);
    EXPECT_EQ(view.knownChannels(), 2U);
}

TEST(SpectralView, ALaterValueReplacesTheEarlier) {
    SpectralView view;
    view.apply(channelList(kTwoChannels));
    view.apply(congestion(1, 70));
    const auto update = view.apply(congestion(1, 0));
    EXPECT_EQ(update.order, 1);
    EXPECT_EQ(update.value, 0);
    EXPECT_EQ(view.channels()[1].congestion, 0);
}

TEST(SpectralView, ValuesThatComeBeforeTheListBelongToIt) {
    SpectralView view;
    view.apply(congestion(1, 70));
    EXPECT_TRUE(view.channels().empty());
    view.apply(channelList(kTwoChannels));
    EXPECT_EQ(view.channels()[1].congestion, 70);
}

TEST(SpectralView, TheSameListAgainKeepsTheValuesAndAnotherOneDoesNot) {
    SpectralView view;
    view.apply(channelList(kTwoChannels));
    view.apply(congestion(1, 70));
    view.apply(channelList(kTwoChannels));
    EXPECT_EQ(view.channels()[1].congestion, 70);
    view.apply(channelList(R"([{"Channel": 6, "Order": 1}])"));
    ASSERT_EQ(view.channels().size(), 1U);
    EXPECT_FALSE(view.channels()[0].isKnown());
}

TEST(SpectralView, AListThatIsNullHasNoChannels) {
    SpectralView view;
    EXPECT_FALSE(view.hasChannelList());
    EXPECT_EQ(view.apply(channelList("null\n")).change, Change::ChannelList);
    EXPECT_TRUE(view.hasChannelList());
    EXPECT_TRUE(view.channels().empty());
}

TEST(SpectralView, MalformedPayloadsChangeNothing) {
    SpectralView view;
    view.apply(channelList(kTwoChannels));
    for (const Event& event :
         {channelList("nonsense"), channelList("{}"), channelList("[7]"), channelList(R"([{"Channel": 1}])"),
          Event{"SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION", ""},
          Event{"SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION", R"({"order": 1})"},
          Event{"SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION", R"({"order": "1", "congestion_value": 2})"},
          Event{"SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE", R"({"order": 1, "congestion_value": 2})"},
          Event{"SOMETHING_ELSE", "7"}}) {
        EXPECT_EQ(view.apply(event).change, Change::None) << event.id << " " << event.data;
    }
    EXPECT_EQ(view.channels().size(), 2U);
    EXPECT_EQ(view.knownChannels(), 0U);
}

TEST(SpectralView, RadioAndAdapterAreAsLastTold) {
    SpectralView view;
    EXPECT_FALSE(view.radioOn());
    EXPECT_EQ(view.apply({"RADIO_ON", ""}).change, Change::Radio);
    EXPECT_EQ(view.radioOn(), true);
    view.apply({"RADIO_OFF", ""});
    EXPECT_EQ(view.radioOn(), false);
    EXPECT_EQ(view.apply({"CARD_PLUG_OUT", ""}).change, Change::Card);
    EXPECT_EQ(view.cardIn(), false);
    view.apply({"CARD_PLUG_IN", ""});
    EXPECT_EQ(view.cardIn(), true);
}

TEST(SpectralView, TheBusiestChannelIsTheLowestOfTheHighest) {
    SpectralView view;
    view.apply(channelList(
        R"([{"Channel": 1, "Order": 3}, {"Channel": 6, "Order": 2}, {"Channel": 11, "Order": 1}])"));
    EXPECT_FALSE(view.busiest());
    view.apply(interference(1, 100));
    EXPECT_FALSE(view.busiest());
    view.apply(congestion(3, 20));
    view.apply(congestion(1, 40));
    EXPECT_EQ(view.busiest()->number, 11);
    view.apply(congestion(2, 40));
    EXPECT_EQ(view.busiest()->number, 6);
}

}  // namespace
}  // namespace vexa::client

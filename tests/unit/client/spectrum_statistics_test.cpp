#include "client/record/SpectrumStatistics.h"

#include <gtest/gtest.h>

#include "contract/Ports.h"

namespace vexa::client {
namespace {

/// Two channels, 6 and 36, and what is told of them at which millisecond.
class Told {
public:
    Told() { tell(0, contract::kChannelListData, R"([{"Channel":6,"Order":2},{"Channel":36,"Order":1}])"); }

    void tell(int at, const char* event, const std::string& data = "") {
        m_statistics.take({RecordedTime(at), RecordedPort::Spectral, {event, data}});
    }
    void congestion(int at, int order, int value) {
        sample(at, contract::kSampleDataCongestion, order, "congestion_value", value);
    }
    void interference(int at, int order, int value) {
        sample(at, contract::kSampleDataInterference, order, "noise_value", value);
    }
    std::map<int, SpectrumStatistics::Channel> at(int end) { return m_statistics.finish(RecordedTime(end)); }

private:
    void sample(int at, const char* event, int order, const std::string& name, int value) {
        tell(at, event,
             R"({"order":)" + std::to_string(order) + ",\"" + name + "\":" + std::to_string(value) + "}");
    }

    SpectrumStatistics m_statistics;
};

TEST(SpectrumStatistics, AValueCountsForAsLongAsItStood) {
    Told told;
    told.interference(1000, 2, 60);
    told.congestion(1001, 2, 20);
    told.congestion(7001, 2, 51);
    told.congestion(9001, 2, 50);
    const auto channels = told.at(11001);
    ASSERT_EQ(channels.size(), 1U);  // of channel 36 nothing was told
    const LevelTimes& congestion = channels.at(6).congestion;
    EXPECT_EQ(congestion.total(), RecordedTime(10000));
    EXPECT_EQ(congestion.least(), 20);
    EXPECT_EQ(congestion.greatest(), 51);
    EXPECT_DOUBLE_EQ(congestion.mean(), (6 * 20 + 2 * 51 + 2 * 50) / 10.0);
    EXPECT_EQ(congestion.percentile(0.6), 20);
    EXPECT_EQ(congestion.percentile(0.61), 50);
    EXPECT_EQ(congestion.percentile(0.95), 51);
    EXPECT_DOUBLE_EQ(congestion.shareAbove(50), 0.2);
    EXPECT_DOUBLE_EQ(channels.at(6).interference.mean(), 60);
}

TEST(SpectrumStatistics, NothingStandsWithoutRadioAdapterOrChannel) {
    Told told;
    told.congestion(0, 1, 80);
    told.tell(1000, contract::kRadioOff);
    told.tell(5000, contract::kRadioOn);
    told.tell(6000, contract::kCardPlugOut);
    told.tell(9000, contract::kCardPlugIn);
    told.congestion(9000, 1, 40);
    told.tell(10000, contract::kChannelListData, R"([{"Channel":1,"Order":1}])");
    const auto channel = told.at(20000).at(36);
    EXPECT_EQ(channel.congestion.total(), RecordedTime(3000));
    EXPECT_EQ(channel.congestion.percentile(0.5), 80);
    EXPECT_EQ(channel.congestion.least(), 40);
    EXPECT_EQ(channel.interference.greatest(), 0);  // never told, so it never changed from 0
    EXPECT_EQ(channel.interference.total(), RecordedTime(3000));
}

TEST(SpectrumStatistics, AValueThatIsToldLateWas0BeforeAndOneToldLastStoodForAMoment) {
    Told told;
    told.interference(0, 1, 30);
    told.congestion(4000, 1, 10);
    told.congestion(5000, 2, 70);
    const auto channels = told.at(5000);
    EXPECT_DOUBLE_EQ(channels.at(36).congestion.mean(), 2);
    EXPECT_EQ(channels.at(6).congestion.percentile(0.5), 70);
}

}  // namespace
}  // namespace vexa::client

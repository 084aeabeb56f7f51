#include <gtest/gtest.h>

#include <algorithm>

#include "client/spectrum/SpectralPicture.h"
#include "unit/client/spectral_events.h"

namespace vexa::client {
namespace {

SpectralView viewWith(int congestionValue, int interferenceValue) {
    SpectralView view;
    view.apply(channelList(R"([{"Channel": 36, "Order": 1}])"));
    view.apply(congestion(1, congestionValue));
    view.apply(interference(1, interferenceValue));
    return view;
}

TEST(SpectralPicture, BarsAreAsLongAsTheirValues) {
    const PictureStyle style{49, false, false};  // bars of 10
    struct {
        int value;
        const char* bar;
    } const rows[] = {{0, "          "},  {9, "          "},  {10, "#         "},
                      {55, "#####     "}, {99, "######### "}, {100, "##########"}};
    for (const auto& row : rows) {
        const auto lines = drawSpectrum(viewWith(row.value, 20), style);
        ASSERT_EQ(lines.size(), 3U);
        EXPECT_EQ(lines[2].substr(16, 10), row.bar) << row.value;
    }
}

TEST(SpectralPicture, ARowTellsBothValues) {
    const auto lines = drawSpectrum(viewWith(30, 100), {49, false, false});
    EXPECT_EQ(lines[0], "1 channel, 3 events");
    EXPECT_EQ(lines[2], "     36      1  ###         30  ########## 100");
}

TEST(SpectralPicture, BlocksShowEighths) {
    const auto lines = drawSpectrum(viewWith(35, 0), {49, false, true});
    EXPECT_NE(lines[2].find("███▌······  35"), std::string::npos) << lines[2];
}

TEST(SpectralPicture, TheColourGoesWithTheValueAndIsEndedInEveryRow) {
    struct {
        int value;
        const char* colour;
    } const rows[] = {{39, "\033[32m"}, {40, "\033[33m"}, {69, "\033[33m"}, {70, "\033[31m"}};
    for (const auto& row : rows) {
        const std::string line = drawSpectrum(viewWith(row.value, 1), {49, true, false})[2];
        EXPECT_EQ(line.substr(16, 5), row.colour) << row.value;
        EXPECT_LT(line.rfind("\033[3"), line.rfind("\033[0m"));
    }
}

TEST(SpectralPicture, WithoutColourThereIsNoEscape) {
    for (const auto& line : drawSpectrum(viewWith(80, 80), {120, false, true}))
        EXPECT_EQ(line.find('\033'), std::string::npos);
}

TEST(SpectralPicture, NoRowIsWiderThanTheTerminal) {
    for (const int columns : {40, 80, 81, 120, 300}) {
        for (const auto& line : drawSpectrum(viewWith(100, 100), {columns, false, false}))
            EXPECT_LT(line.size(), static_cast<std::size_t>(columns));
    }
}

}  // namespace
}  // namespace vexa::client

#include "client/spectrum/SpectralPicture.h"

#include <algorithm>
#include <array>
#include <iomanip>
#include <sstream>

#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

constexpr int kTopValue = 100;
constexpr int kColumnsWithoutBars = 22;
constexpr int kShortestBar = 4;
constexpr int kLongestBar = 40;
constexpr int kEighths = 8;
constexpr std::array kPartialBlocks{"", "▏", "▎", "▍", "▌", "▋", "▊", "▉"};

constexpr const char* kReset = "\033[0m";
constexpr const char* kBold = "\033[1m";
constexpr const char* kDim = "\033[2m";

/// From this value on a bar has this colour.
struct Threshold {
    int from;
    const char* colour;
};
using Scale = std::array<Threshold, 3>;
constexpr Scale kCongestionScale{{{70, "\033[31m"}, {40, "\033[33m"}, {0, "\033[32m"}}};
constexpr Scale kInterferenceScale{{{85, "\033[31m"}, {65, "\033[35m"}, {0, "\033[36m"}}};

const char* colourOf(int value, const Scale& scale) {
    for (const Threshold& threshold : scale) {
        if (value >= threshold.from) return threshold.colour;
    }
    return kReset;
}

std::string painted(const std::string& text, const char* colour, const PictureStyle& style) {
    return style.colour && !text.empty() ? colour + text + kReset : text;
}

std::string rightAligned(const std::string& text, int width) {
    std::ostringstream out;
    out << std::setw(width) << text;
    return out.str();
}

int barLength(const PictureStyle& style) {
    return std::clamp((style.columns - kColumnsWithoutBars) / 2, kShortestBar, kLongestBar);
}

std::string repeated(const char* glyph, int times) {
    std::string text;
    for (int i = 0; i < times; ++i)
        text += glyph;
    return text;
}

std::string bar(int value, const Scale& scale, const PictureStyle& style) {
    const int length = barLength(style);
    const int eighths = std::clamp(value, 0, kTopValue) * length * kEighths / kTopValue;
    int filled = eighths / kEighths;
    std::string text = repeated(style.blocks ? "█" : "#", filled);
    if (const int part = eighths % kEighths; style.blocks && part > 0) {
        text += kPartialBlocks[static_cast<std::size_t>(part)];
        ++filled;
    }
    return painted(text, colourOf(value, scale), style) +
           painted(repeated(style.blocks ? "·" : " ", length - filled), kDim, style);
}

std::string quantity(const SpectralView::Channel& channel, std::optional<int> value, const Scale& scale,
                     const PictureStyle& style) {
    const auto certain = channel.certain(value);
    return bar(certain.value_or(0), scale, style) + rightAligned(certain ? std::to_string(*certain) : "-", 4);
}

std::string heading(const PictureStyle& style) {
    std::ostringstream out;
    out << "Channel  " << std::left << std::setw(barLength(style) + 6) << "Congestion"
        << "Interference";
    return painted(out.str(), kBold, style);
}

std::string status(const SpectralView& view) {
    std::string text =
        counted(view.channels().size(), "channel") + ", " + counted(view.eventCount(), "event");
    if (view.radioOn()) text += *view.radioOn() ? ", radio on" : ", radio off";
    if (view.cardIn() && !*view.cardIn()) text += ", adapter out";
    return text;
}

}  // namespace

std::vector<std::string> drawSpectrum(const SpectralView& view, const PictureStyle& style) {
    std::vector<std::string> lines{status(view), heading(style)};
    for (const auto& channel : view.channels()) {
        lines.push_back(rightAligned(std::to_string(channel.number), 7) + "  " +
                        quantity(channel, channel.congestion, kCongestionScale, style) + "  " +
                        quantity(channel, channel.interference, kInterferenceScale, style));
    }
    return lines;
}

}  // namespace vexa::client

#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <vector>

#include "client/HotspotNews.h"
#include "client/SpectralScan.h"
#include "client/TerminalScreen.h"

namespace vexa::client {

/// How a running scan is shown: a picture on a terminal, a line per event elsewhere.
class SpectrumOutput {
public:
    enum class Form { Readable, Json };

    /// `side`: lines that stand under the picture, or before the first event.
    explicit SpectrumOutput(Form form, std::vector<std::string> side = {});

    void show(const std::vector<SpectralScan::Told>& told, const SpectralView& view);

    /// What is told beside the spectrum, and how things stand now.
    void showNews(const std::vector<HotspotNews::Item>& items, std::vector<std::string> lines);

    /// Draws what has changed, but not too often. Gives the time until it should be called again; nothing:
    /// not before something has happened.
    std::optional<std::chrono::milliseconds> refresh(const SpectralView& view);

    /// The last picture, and one line that says what was seen.
    void finish(const SpectralView& view);

    /// The terminal was resized, or this process is to be suspended.
    void handleSignal(int signal);

    int keyDescriptor() const { return m_screen ? m_screen->keys().descriptor() : -1; }

    /// Reads a key; true if it asks for the end.
    bool isQuitKey();

    /// Nobody reads the output any more.
    bool isGone() const;

private:
    void printLine(const SpectralScan::Told& told, const SpectralView& view) const;
    std::vector<std::string> picture(const SpectralView& view) const;

    Form m_form;
    std::vector<std::string> m_side;
    std::vector<std::string> m_news;
    std::optional<TerminalScreen> m_screen;
    std::chrono::steady_clock::time_point m_start;
    std::chrono::steady_clock::time_point m_nextDrawing;
    bool m_changed = true;
};

}  // namespace vexa::client

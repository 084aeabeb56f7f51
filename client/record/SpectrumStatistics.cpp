#include "client/record/SpectrumStatistics.h"

#include <algorithm>

namespace vexa::client {

namespace {

constexpr int kTopLevel = 100;

// Both values of a channel come in one burst.
constexpr RecordedTime kWholeScan{500};

}  // namespace

void LevelTimes::add(int level, RecordedTime time) {
    m_times[static_cast<std::size_t>(std::clamp(level, 0, kTopLevel))] += time;
    m_total += time;
}

int LevelTimes::least() const {
    int level = 0;
    for (const RecordedTime time : m_times) {
        if (time.count() > 0) return level;
        ++level;
    }
    return 0;
}

int LevelTimes::greatest() const {
    return percentile(1.0);
}

double LevelTimes::mean() const {
    double sum = 0;
    int level = 0;
    for (const RecordedTime time : m_times)
        sum += static_cast<double>(time.count()) * level++;
    return m_total.count() == 0 ? 0 : sum / static_cast<double>(m_total.count());
}

int LevelTimes::percentile(double share) const {
    const double wanted = share * static_cast<double>(m_total.count());
    RecordedTime passed{};
    for (int level = 0; level <= kTopLevel; ++level) {
        passed += m_times[static_cast<std::size_t>(level)];
        if (passed.count() > 0 && static_cast<double>(passed.count()) >= wanted) return level;
    }
    return 0;
}

double LevelTimes::shareAbove(int limit) const {
    RecordedTime above{};
    for (int level = std::max(limit + 1, 0); level <= kTopLevel; ++level)
        above += m_times[static_cast<std::size_t>(level)];
    return m_total.count() == 0 ? 0
                                : static_cast<double>(above.count()) / static_cast<double>(m_total.count());
}

// One that was not told when the other one was has been 0 since then.
void SpectrumStatistics::Level::tell(std::optional<int> value) {
    if (value && !m_value && m_untold > kWholeScan) m_times.add(0, m_untold);
    if (value) m_untold = {};
    m_value = value;
}

void SpectrumStatistics::Level::pass(RecordedTime time) {
    if (m_value)
        m_times.add(*m_value, time);
    else
        m_untold += time;
}

// One that was told at the very end has stood for a moment.
LevelTimes SpectrumStatistics::Level::finish() {
    if (!m_value) m_times.add(0, m_untold);
    if (m_times.total().count() == 0) m_times.add(m_value.value_or(0), RecordedTime(1));
    return m_times;
}

void SpectrumStatistics::take(const RecordedEvent& recorded) {
    if (recorded.port != RecordedPort::Spectral) return;
    pass(recorded.at);
    m_view.apply(recorded.event);
    for (auto& [number, known] : m_channels)
        known.isKnown = false;
    for (const auto& channel : m_view.channels()) {
        if (!channel.isKnown()) continue;
        Known& known = m_channels[channel.number];
        known.isKnown = true;
        known.congestion.tell(channel.congestion);
        known.interference.tell(channel.interference);
    }
}

std::map<int, SpectrumStatistics::Channel> SpectrumStatistics::finish(RecordedTime end) {
    pass(end);
    std::map<int, Channel> channels;
    for (auto& [number, known] : m_channels)
        channels.emplace(number, Channel{known.congestion.finish(), known.interference.finish()});
    return channels;
}

void SpectrumStatistics::pass(RecordedTime now) {
    const RecordedTime passed = std::max(now - m_now, RecordedTime{});
    m_now = std::max(now, m_now);
    if (!m_view.radioOn().value_or(true) || !m_view.cardIn().value_or(true)) return;
    for (auto& [number, known] : m_channels) {
        if (!known.isKnown) continue;
        known.congestion.pass(passed);
        known.interference.pass(passed);
    }
}

}  // namespace vexa::client

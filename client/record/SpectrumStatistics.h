#pragma once

#include <array>
#include <map>
#include <optional>

#include "client/record/Recording.h"
#include "client/spectrum/SpectralView.h"

namespace vexa::client {

/// How long a value from 0 to 100 stood at which level. What it tells is weighted by time; before add() all
/// is 0.
class LevelTimes {
public:
    void add(int level, RecordedTime time);

    RecordedTime total() const { return m_total; }
    int least() const;
    int greatest() const;
    double mean() const;
    /// The lowest level that it did not exceed for this share of the time.
    int percentile(double share) const;
    double shareAbove(int limit) const;

private:
    std::array<RecordedTime, 101> m_times{};
    RecordedTime m_total{};
};

/// What a recording tells of each channel. The service tells a value when it has changed, so each one stands
/// until the next; while the radio is off or the adapter out there is none. Pure: fed with the events.
class SpectrumStatistics {
public:
    struct Channel {
        LevelTimes congestion;
        LevelTimes interference;
    };

    void take(const RecordedEvent& recorded);

    /// The recording ends here. By number, those of which a value was told.
    std::map<int, Channel> finish(RecordedTime end);

private:
    /// One value of a channel.
    class Level {
    public:
        void tell(std::optional<int> value);
        void pass(RecordedTime time);
        LevelTimes finish();

    private:
        LevelTimes m_times;
        std::optional<int> m_value;
        RecordedTime m_untold{};
    };
    struct Known {
        Level congestion;
        Level interference;
        bool isKnown = false;
    };

    void pass(RecordedTime now);

    SpectralView m_view;
    std::map<int, Known> m_channels;
    RecordedTime m_now{};
};

}  // namespace vexa::client

#pragma once

#include <json/value.h>

#include <map>
#include <string>

#include "client/record/Recording.h"
#include "client/record/ScenarioTimeline.h"
#include "client/spectrum/SpectralView.h"

namespace vexa::client {

/// Makes the spectrum of a scenario of the values that a recording tells. Pure: fed with the events.
class SpectrumScenario {
public:
    void take(const RecordedEvent& recorded);

    /// To be called once, at the end of the recording. Adds members to the scenario, and says what in them is
    /// made up.
    void write(Json::Value& scenario, ScenarioTimeline& timeline, ScenarioNotes& notes) const;

private:
    void takeList();
    void takeSample(RecordedTime at, const SpectralView::Update& update);

    SpectralView m_view;
    Json::Value m_channels;
    bool m_isOtherList = false;
    std::map<int, int> m_congestion;  ///< The last value of each channel.
    std::map<RecordedTime, Json::Value> m_levels;
};

}  // namespace vexa::client

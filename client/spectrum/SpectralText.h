#pragma once

#include <json/value.h>

#include <string>
#include <vector>

#include "client/port/Event.h"
#include "client/spectrum/SpectralView.h"

namespace vexa::client {

// The spectrum in words. Lines have no line end.

/// One event, after it was applied to the view with this outcome.
std::string describeEvent(const Event& event, const SpectralView::Update& update, const SpectralView& view);

/// One row per channel: number, congestion, interference; a heading first.
std::vector<std::string> spectrumTable(const SpectralView& view);

/// The same as a JSON object, with the order too.
Json::Value spectrumJson(const SpectralView& view);

/// What was seen: channels, events, the busiest channel.
std::string summaryText(const SpectralView& view);
Json::Value summaryJson(const SpectralView& view);

}  // namespace vexa::client

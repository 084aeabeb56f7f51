#pragma once

#include <map>
#include <optional>
#include <span>
#include <vector>

#include "spectral/SpectralMessages.h"

namespace vexa {

// The arithmetic of the analyser: no I/O, no lock, no state.

/// Channel number to its 1-based order.
using ChannelOrder = std::map<int, int>;

/// The distinct channels get orders from 1 in the sequence of the list; a repeat keeps the first.
ChannelOrder orderChannels(std::span<const int> channels);

/// The channel of a centre frequency in MHz; nothing where there is none.
std::optional<int> frequencyToChannel(int frequency);

/// The level of one sample in dB: the mean of its bins, each with its share of the record's power, none below
/// -120. Infinite or not a number for a record without any magnitude or with an absurd power.
double sampleLevel(const SampleRecord& record);

/// The values of one channel, 0 to 100: the mean congestion, and the mean level above -120 dB.
struct ChannelValues {
    int congestion;
    int noise;
};

/// By channel number, for the channels that have samples.
std::map<int, ChannelValues> computeChannelValues(std::span<const SampleRecord> samples);

/// What is published after `published`, when `computed` is the new value: a step of 60 %, truncated; from 0
/// at once.
int smoothCongestion(int published, int computed);

}  // namespace vexa

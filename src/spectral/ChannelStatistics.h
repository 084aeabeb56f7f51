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

/// No level lies below it, in dB.
inline constexpr double kLevelFloor = -120.0;
/// The level of all of a record with a power of 0, in dB.
inline constexpr double kLevelOfPowerZero = -96.0;

/// The sum of the squares of a record's magnitudes; a whole number.
double sumOfSquares(const SampleRecord& record);

/// The level of one sample in dB: the mean of its bins, each with its share of the record's power, none below
/// -120. Infinite or not a number for a record without any magnitude or with an absurd power.
double sampleLevel(const SampleRecord& record);

/// The values of one channel, 0 to 100: the mean congestion, and the mean level above -120 dB.
struct ChannelValues {
    int congestion;
    int noise;
};

/// By channel number, for the channels that have samples. The integers are those of the sums of sampleLevel()
/// in the order of the samples.
std::map<int, ChannelValues> computeChannelValues(std::span<const SampleRecord> samples);

/// What is published after `published`, when `computed` is the new value: a step of 60 %, truncated; from 0
/// at once.
int smoothCongestion(int published, int computed);

}  // namespace vexa

#pragma once

#include <cstddef>
#include <optional>

#include "spectral/SpectralMessages.h"

namespace vexa {

/// The mean of the levels of a channel is known to this by estimates, in dB, for as many records at most.
inline constexpr double kEstimateError = 1e-6;
inline constexpr std::size_t kMostEstimates = 1'000'000;

struct LevelEstimate {
    double level;
    /// Equal to the exact one to the last bit: all bins lie at the floor.
    bool isExact;
};

/// What sampleLevel gives, nearly, with one logarithm instead of 56. Nothing for a record without any
/// magnitude or with an absurd power, for which no bound of the error holds.
std::optional<LevelEstimate> estimateLevel(const SampleRecord& record);

}  // namespace vexa

#pragma once

#include <map>
#include <span>

#include "spectral/SpectralMessages.h"

namespace vexa::bench {

struct BareValues {
    int congestion = 0;
    int noise = 0;
};

/// The values of each channel, by the plainest loop that gives them: the samples sorted into a list for each
/// channel, every bin's level worked out by itself.
std::map<int, BareValues> bareChannelValues(std::span<const SampleRecord> samples);

}  // namespace vexa::bench

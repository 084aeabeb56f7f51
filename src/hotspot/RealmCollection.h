#pragma once

#include <cstddef>
#include <utility>
#include <vector>

#include "hotspot/NaiRealmParser.h"

namespace vexa {

/// What a network keeps of the realms that it announces: so many, with so many bytes of names. A few hundred
/// bytes of air can name a hundred times as many.
inline constexpr std::size_t kMaxRealms = 256;
inline constexpr std::size_t kMaxRealmBytes = kMaxRealms * 32;

/// Gathers the realms of one network.
class RealmCollection {
public:
    /// False if there is no room for it; from then on there is none for anything, which a line in the log
    /// tells.
    bool add(RealmInfo realm);
    bool isFull() const { return m_isFull; }
    std::vector<RealmInfo> take() { return std::move(m_realms); }

private:
    std::vector<RealmInfo> m_realms;
    std::size_t m_bytes = 0;
    bool m_isFull = false;
};

}  // namespace vexa

#pragma once

#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "unit/hotspot/WireBytes.h"

namespace vexa::test {

/// A realm name with the number of an EAP method as it stands on the wire (13 or 21).
using DissectedRealm = std::pair<std::string, unsigned>;

/// Reads an ANQP NAI Realm list a second time, with offsets into the bytes and nothing else: what the
/// service's parser is compared with. Nothing where the list has to be refused.
std::optional<std::vector<DissectedRealm>> dissectRealms(const Block& list);

}  // namespace vexa::test

#pragma once

#include <cstdint>

namespace vexa {

/// Builds the spectral server, so that notifications begin, then opens the channel of the hotspot server,
/// then that of the spectral server. A channel that can't be opened is missing; the process runs on without
/// it.
void createIpcServers(std::int32_t saPort, std::uint32_t hs20Port);

/// Ends the spectral server; no notification reaches the process from here on.
void destroySpectralServer();

}  // namespace vexa

#pragma once

#include "client/spectrum/SideShow.h"
#include "client/spectrum/SpectralScan.h"
#include "client/spectrum/SpectrumOutput.h"
#include "client/terminal/Deadline.h"
#include "client/terminal/Signals.h"

namespace vexa::client {

/// Scans and shows what is told until the user has had enough, or until `end`; then the scan is stopped and
/// the last word printed. `side`, if not null, is shown beside it. Throws ClientError when a connection is
/// lost.
void watchSpectrum(SpectralScan& scan, Signals& signals, SpectrumOutput& output, Deadline end,
                   SideShow* side = nullptr);

}  // namespace vexa::client

#pragma once

#include <string>
#include <vector>

#include "client/spectrum/SpectralView.h"

namespace vexa::client {

/// What the terminal can show.
struct PictureStyle {
    int columns = 80;
    bool colour = false;
    bool blocks = false;
};

/// The spectrum as bars, one row per channel, below two lines of heading. Lines have no line end.
std::vector<std::string> drawSpectrum(const SpectralView& view, const PictureStyle& style);

}  // namespace vexa::client

#pragma once

#include "text/PrintfFormat.h"

namespace vexa {

/// printf to standard output, which normally nobody sees: the process has no console. Any thread; one call is
/// one piece.
void printToStandardOutput(const char* format, ...) VEXA_PRINTF(1, 2);

}  // namespace vexa

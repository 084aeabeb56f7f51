#include "base/StandardOutput.h"

#include <cstdarg>
#include <cstdio>

namespace vexa {

void printToStandardOutput(const char* format, ...) {
    std::va_list arguments;
    va_start(arguments, format);
    std::vprintf(format, arguments);
    va_end(arguments);
    std::fflush(stdout);
}

}  // namespace vexa

#pragma once

// Lets the compiler check the arguments of printf-style functions; `position` counts the format among the
// parameters, `first` the first value.

#if defined(__GNUC__)
#define VEXA_PRINTF(position, first) __attribute__((format(printf, position, first)))
#else
#define VEXA_PRINTF(position, first)
#endif

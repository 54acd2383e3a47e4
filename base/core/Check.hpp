// Assertion builds check themselves.
#pragma once

#include "host/Diagnostics.hpp"

/// Ends the program through the host's fatal diagnostic where a condition of the library's own does not hold.  Compiled
/// in only where VTSYM_CHECKS is set: the condition has no effects of its own.
#if defined(VTSYM_CHECKS) && VTSYM_CHECKS
#define VTSYM_CHECK(condition)                                                                                         \
    do {                                                                                                               \
        if (!(condition))                                                                                              \
            vtsvFatalDiagnostic("broken invariant: " #condition, __FILE__, __LINE__, __PRETTY_FUNCTION__);             \
    } while (false)
#else
#define VTSYM_CHECK(condition) static_cast<void>(0)
#endif

// Checks that the library makes of itself, in assertion builds only (VTSYM_CHECKS, set by every preset but `release`).
//
// A check states what its author believes: an invariant, a postcondition, a kept answer that equals a fresh one.  It
// has no effects of its own, so that removing it changes nothing.
#pragma once

#include "host/Diagnostics.hpp"

#if defined(VTSYM_CHECKS) && VTSYM_CHECKS

/// Ends the program through the host's fatal diagnostic where a condition of the library's own does not hold.
#define VTSYM_CHECK(condition)                                                                                         \
    do {                                                                                                               \
        if (!(condition))                                                                                              \
            vtsvFatalDiagnostic("broken invariant: " #condition, __FILE__, __LINE__, __PRETTY_FUNCTION__);             \
    } while (false)

/// The same for a condition that is dear to compute: checked the first time that a thread comes by, and every 64th time
/// from there.
#define VTSYM_CHECK_SAMPLED(condition)                                                                                 \
    do {                                                                                                               \
        static thread_local unsigned passed = 0;                                                                       \
        if (passed++ % 64 == 0)                                                                                        \
            VTSYM_CHECK(condition);                                                                                    \
    } while (false)

#else
#define VTSYM_CHECK(condition) static_cast<void>(0)
#define VTSYM_CHECK_SAMPLED(condition) static_cast<void>(0)
#endif

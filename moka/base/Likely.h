// Likely.h: tells the compiler the usual value of a condition on a hot path. The usual code then lies in one
// piece, and jumps are taken in the unusual case only. For the same purpose, functions that a hot path calls
// in an unusual case are marked [[gnu::cold]].
// These are macros because the hint of a function would be lost for conditions with && or ||.
#pragma once

#define MOKA_LIKELY(condition) __builtin_expect(static_cast<bool>(condition), true)
#define MOKA_UNLIKELY(condition) __builtin_expect(static_cast<bool>(condition), false)

// Check.h: detects broken contracts. If checks are compiled in (MOKA_CHECKS, set in debug builds),
// MOKA_CHECK(condition, text) logs the text and ends the process if the condition is false. Otherwise the
// condition is not evaluated. Expected failures are return values and log lines, never checks.
#pragma once

#include "moka/base/Export.h"

namespace Moka::detail {
[[noreturn]] MOKA_API void CheckFailed(char const* file, int line, char const* condition, char const* text);
}

#if defined(MOKA_CHECKS) && MOKA_CHECKS
#define MOKA_CHECK(condition, text)                                                                          \
    do {                                                                                                     \
        if (!(condition)) ::Moka::detail::CheckFailed(__FILE__, __LINE__, #condition, text);                 \
    } while (false)
#else
#define MOKA_CHECK(condition, text) static_cast<void>(sizeof((condition) ? 1 : 0))
#endif

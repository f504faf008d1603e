// Export.h: MOKA_API marks the exported symbols of the libraries. All other symbols are hidden.
#pragma once

#if defined(__cplusplus) && __cplusplus < 201703L
#error "libMokaGraphics needs C++17: compile with -std=c++17, or link Moka::Graphics, which requires it"
#endif

#define MOKA_API __attribute__((visibility("default")))

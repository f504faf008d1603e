// Export.h: marks what a library of this tree lets others link to. Everything else stays hidden.
#pragma once

#if defined(__cplusplus) && __cplusplus < 201703L
#error "libMokaGraphics needs C++17: compile with -std=c++17, or link Moka::Graphics, which asks CMake for it"
#endif

#define MOKA_API __attribute__((visibility("default")))

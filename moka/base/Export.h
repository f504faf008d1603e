// Export.h: marks what a library of this tree lets others link to. Everything else stays hidden.
#pragma once

#define MOKA_API __attribute__((visibility("default")))

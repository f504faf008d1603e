// Utf.h: conversion between UTF-8 and UTF-16. Each lone surrogate becomes U+FFFD. So does, in malformed
// UTF-8, each longest incomplete beginning of a character, and each other byte.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace Moka::detail {

std::u16string Utf16FromUtf8(std::string_view utf8);
// Converts each malformed byte to U+DC00 plus the byte.
std::u16string Utf16FromFileName(std::string_view bytes);

// Returns the code point at position and moves position after it. position must be below the length.
char32_t NextCodePoint(std::u16string_view text, std::size_t& position);

// Writes a code point, which must not be a surrogate, to bytes, which needs room for four. Returns the number
// of bytes.
std::size_t EncodeUtf8(char32_t codePoint, char* bytes);

} // namespace Moka::detail

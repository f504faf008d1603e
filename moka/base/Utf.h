// Utf.h: conversion between UTF-8 and UTF-16. Malformed input becomes U+FFFD: a lone surrogate once, and of
// malformed UTF-8 each longest run of bytes that began a character, or else each single byte.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace Moka::detail {

std::u16string Utf16FromUtf8(std::string_view utf8);
// Each byte of what is malformed as U+DC00 and the byte.
std::u16string Utf16FromFileName(std::string_view bytes);

// The code point at position, which is moved behind it. position is below the length.
char32_t NextCodePoint(std::u16string_view text, std::size_t& position);

// Writes a code point other than a surrogate to bytes, which has room for four. Returns how many it took.
std::size_t EncodeUtf8(char32_t codePoint, char* bytes);

} // namespace Moka::detail

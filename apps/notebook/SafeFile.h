// SafeFile.h: replaces files atomically, and appends to files.
// Fails: returns the system's error message, or an empty string on success.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace Moka::Notebook {

// Writes a new file beside path, flushes it to the disk and renames it. A failure keeps the old file.
std::string ReplaceFile(std::string const& path, std::string_view text);

// Creates the file if it is missing. A failure restores the file's length.
std::string AppendToFile(std::string const& path, std::string_view text);

// Returns false if the file does not exist. Sets reason if it cannot be read.
bool ReadFile(std::string const& path, std::string& text, std::string& reason);

// Returns a hash of the text.
std::uint64_t Fingerprint(std::string_view text);

} // namespace Moka::Notebook

// SafeFile.h: files that are replaced whole or not at all, and files that only grow.
// Fails: with the system's reason in words, empty when all is well.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace Moka::Notebook {

// Into a new file beside it, flushed to the disk, then renamed. A failure leaves the old file.
std::string ReplaceFile(std::string const& path, std::string_view text);

// Missing files are made. A failure leaves the file as long as it was.
std::string AppendToFile(std::string const& path, std::string_view text);

// False when it does not exist; a file that cannot be read is a reason.
bool ReadFile(std::string const& path, std::string& text, std::string& reason);

// Tells contents apart.
std::uint64_t Fingerprint(std::string_view text);

} // namespace Moka::Notebook

#include "apps/notebook/SafeFile.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <memory>
#include <sys/stat.h>
#include <unistd.h>

namespace Moka::Notebook {
namespace {

std::string Explain() { return std::strerror(errno); }

struct Close {
    void operator()(std::FILE* file) const { std::fclose(file); }
};
using File = std::unique_ptr<std::FILE, Close>;

// Null with errno set. Nothing is held back for later: what a failed write leaves is known.
File Open(std::string const& path, char const* mode) {
    File file(std::fopen(path.c_str(), mode));
    if (file) std::setvbuf(file.get(), nullptr, _IONBF, 0);
    return file;
}

// False with errno set.
bool WriteToDisk(File const& file, std::string_view text) {
    return std::fwrite(text.data(), 1, text.size(), file.get()) == text.size() &&
           fdatasync(fileno(file.get())) == 0;
}

} // namespace

std::string ReplaceFile(std::string const& path, std::string_view text) {
    std::string const draft = path + ".new-" + std::to_string(getpid());
    File file = Open(draft, "we");
    if (!file) return Explain();
    struct stat old {};
    if (stat(path.c_str(), &old) == 0) fchmod(fileno(file.get()), old.st_mode & 0777);
    std::string reason;
    if (!WriteToDisk(file, text)) reason = Explain();
    file.reset();
    if (reason.empty() && rename(draft.c_str(), path.c_str()) != 0) reason = Explain();
    if (!reason.empty()) unlink(draft.c_str());
    // The new name, too, outlives a power cut.
    File const folder = Open((std::filesystem::path(path).parent_path() / ".").string(), "re");
    if (folder) fsync(fileno(folder.get()));
    return reason;
}

std::string AppendToFile(std::string const& path, std::string_view text) {
    File const file = Open(path, "ae");
    if (!file) return Explain();
    struct stat before {};
    bool const isSized = fstat(fileno(file.get()), &before) == 0;
    if (WriteToDisk(file, text)) return {};
    std::string const reason = Explain();
    bool const isCut = isSized && ftruncate(fileno(file.get()), before.st_size) == 0;
    return isCut ? reason : reason + ", and a part of a line is left in the file";
}

bool ReadFile(std::string const& path, std::string& text, std::string& reason) {
    File const file = Open(path, "re");
    if (!file) {
        if (errno != ENOENT) reason = Explain();
        return false;
    }
    char block[65536];
    while (std::size_t const count = std::fread(block, 1, sizeof(block), file.get()))
        text.append(block, count);
    if (std::ferror(file.get())) reason = Explain();
    return reason.empty();
}

// FNV-1a, 64 bits.
std::uint64_t Fingerprint(std::string_view text) {
    std::uint64_t hash = 14695981039346656037u;
    for (char const c : text) hash = (hash ^ static_cast<unsigned char>(c)) * 1099511628211u;
    return hash;
}

} // namespace Moka::Notebook

#include "apps/notebook/SafeFile.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <filesystem>
#include <sys/stat.h>
#include <unistd.h>

namespace Moka::Notebook {
namespace {

std::string Explain(int error) { return std::strerror(error); }

class File {
public:
    File(std::string const& path, int flags) : mDescriptor(open(path.c_str(), flags | O_CLOEXEC, 0666)) {}
    ~File() {
        if (mDescriptor >= 0) close(mDescriptor);
    }
    File(File const&) = delete;
    File& operator=(File const&) = delete;

    bool IsOpen() const { return mDescriptor >= 0; }
    off_t GetSize() const {
        struct stat status {};
        return fstat(mDescriptor, &status) == 0 ? status.st_size : -1;
    }
    bool Cut(off_t size) const { return ftruncate(mDescriptor, size) == 0; }

    // False with errno set.
    bool Write(std::string_view text) const {
        while (!text.empty()) {
            ssize_t const count = write(mDescriptor, text.data(), text.size());
            if (count < 0 && errno == EINTR) continue;
            if (count < 0) return false;
            text.remove_prefix(static_cast<std::size_t>(count));
        }
        return fdatasync(mDescriptor) == 0;
    }
    ssize_t Read(char* to, std::size_t size) const { return read(mDescriptor, to, size); }

private:
    int const mDescriptor;
};

} // namespace

std::string ReplaceFile(std::string const& path, std::string_view text) {
    std::string const draft = path + ".new-" + std::to_string(getpid());
    int error = 0;
    {
        File const file(draft, O_WRONLY | O_CREAT | O_TRUNC);
        if (!file.IsOpen()) return Explain(errno);
        struct stat old {};
        if (stat(path.c_str(), &old) == 0) chmod(draft.c_str(), old.st_mode & 0777);
        if (!file.Write(text)) error = errno;
    }
    if (error == 0 && rename(draft.c_str(), path.c_str()) != 0) error = errno;
    if (error != 0) unlink(draft.c_str());
    if (error != 0) return Explain(error);
    // The new name, too, outlives a power cut.
    int const folder =
        open((std::filesystem::path(path).parent_path() / ".").c_str(), O_RDONLY | O_DIRECTORY);
    if (folder >= 0) {
        fsync(folder);
        close(folder);
    }
    return {};
}

std::string AppendToFile(std::string const& path, std::string_view text) {
    File const file(path, O_WRONLY | O_CREAT | O_APPEND);
    if (!file.IsOpen()) return Explain(errno);
    off_t const size = file.GetSize();
    if (file.Write(text)) return {};
    std::string const reason = Explain(errno);
    return size >= 0 && file.Cut(size) ? reason : reason + ", and a part of a line is left in the file";
}

bool ReadFile(std::string const& path, std::string& text, std::string& reason) {
    File const file(path, O_RDONLY);
    if (!file.IsOpen()) {
        if (errno != ENOENT) reason = Explain(errno);
        return false;
    }
    char block[65536];
    ssize_t count = 0;
    while ((count = file.Read(block, sizeof(block))) > 0) text.append(block, static_cast<std::size_t>(count));
    if (count < 0) reason = Explain(errno);
    return count == 0;
}

// FNV-1a, 64 bits.
std::uint64_t Fingerprint(std::string_view text) {
    std::uint64_t hash = 14695981039346656037u;
    for (char const c : text) hash = (hash ^ static_cast<unsigned char>(c)) * 1099511628211u;
    return hash;
}

} // namespace Moka::Notebook

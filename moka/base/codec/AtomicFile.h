// AtomicFile: writes a file so that its name shows either the old content or the whole new one. Everything
// goes to a temporary file in the same folder (".name.xxxxxx.tmp"), which takes the name over only after it
// has reached the disk. A new file gets the usual permissions, a replaced one keeps its own.
// Links:  a symbolic link stays one; the file it leads to is replaced, or made.
// Fails:  on anything but a regular file or nothing under the name, and on a write-protected file. The first
//         failure is remembered; from then on nothing is written, and the temporary file goes with this
//         object.
#pragma once

#include "moka/base/NonAssignable.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>

namespace Moka::detail {

class AtomicFile : NonAssignable {
public:
    AtomicFile() = default;
    ~AtomicFile();

    bool Open(std::string const& path);

    // Allocate nothing and throw nothing, so that codecs written in C can call them.
    bool Write(void const* data, std::size_t count) noexcept;
    // Overwrites from the first byte on; count bytes must have been written before.
    bool WriteStart(void const* data, std::size_t count) noexcept;
    std::uint64_t GetBytesWritten() const { return mWritten; }

    bool Commit();

    // Empty while nothing has failed.
    std::string GetReason() const;

private:
    bool FollowLinks(std::string const& path);
    bool CheckTarget(bool& replaces, unsigned& mode);
    bool CreateTemporary();
    bool Flush() noexcept;
    bool WriteAll(unsigned char const* data, std::size_t count) noexcept;
    bool Fail(char const* step, int error) noexcept;

    std::string mTarget;
    std::string mTemporary; // empty while there is none
    std::unique_ptr<unsigned char[]> mBuffer;
    std::size_t mBuffered = 0;
    std::uint64_t mWritten = 0;
    int mFile = -1;
    char const* mFailedStep = nullptr;
    int mError = 0; // 0: the step says all
};

} // namespace Moka::detail

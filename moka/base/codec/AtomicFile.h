// AtomicFile: replaces a file atomically: its name always refers to the old content or to the complete new
// content. The data is written to a temporary file in the same folder (".name.xxxxxx.tmp"), flushed to the
// disk, and renamed. A new file gets the default permissions; a replaced file keeps its own.
// Links:  a symbolic link is kept; its target is replaced or created.
// Fails:  if the name exists and is not a regular file, or is write-protected. The first failure is stored;
//         after it nothing is written, and the destructor removes the temporary file.
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

    // These allocate nothing and do not throw, so that codecs in C can call them.
    bool Write(void const* data, std::size_t count) noexcept;
    // Overwrites the first count bytes, which must have been written before.
    bool WriteStart(void const* data, std::size_t count) noexcept;
    std::uint64_t GetBytesWritten() const { return mWritten; }

    bool Commit();

    // The reason of the first failure; empty if there is none.
    std::string GetReason() const;

private:
    bool FollowLinks(std::string const& path);
    bool CheckTarget(bool& replaces, unsigned& mode);
    bool CreateTemporary();
    bool Flush() noexcept;
    bool WriteAll(unsigned char const* data, std::size_t count) noexcept;
    bool Fail(char const* step, int error) noexcept;

    std::string mTarget;
    std::string mTemporary; // empty if there is no temporary file
    std::unique_ptr<unsigned char[]> mBuffer;
    std::size_t mBuffered = 0;
    std::uint64_t mWritten = 0;
    int mFile = -1;
    char const* mFailedStep = nullptr;
    int mError = 0; // an errno, or 0
};

} // namespace Moka::detail

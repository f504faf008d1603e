// ImageSource: the bytes of one encoded image, from a file or from memory, read once from front to back or as
// a whole, as the codec likes it. Files are read, never mapped: a file cut short under us then is a short
// read and not a signal.
// Owner:   of the open file and of what was read from it; memory belongs to the caller and must outlive this.
// Fails:   anything but a regular file, a file that cannot be opened, or one no image of ours can fill.
// Cost:    reading on keeps one block in memory; Prefix keeps what was asked for.
#pragma once

#include "moka/base/NonAssignable.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <string>

namespace Moka::detail {

struct ByteSpan {
    unsigned char const* data = nullptr;
    std::size_t size = 0;
};

struct FreeDeleter {
    void operator()(void* memory) const { std::free(memory); }
};
using MallocBytes = std::unique_ptr<unsigned char[], FreeDeleter>;

class ImageSource : NonAssignable {
public:
    ImageSource() = default;
    ~ImageSource();

    bool OpenFile(char const* path, std::string& reason);
    void OpenMemory(void const* data, std::size_t size);

    // Of the whole, as it was when opened.
    std::uint64_t GetSize() const { return mSize; }

    // The first bytes, count or fewer when there are no more. False when reading fails or memory runs out.
    // Independent of reading on; valid until the next Prefix.
    bool Prefix(std::uint64_t count, ByteSpan& span, std::string& reason);

    // Reads on. The next stretch, of a length that suits the source; empty at the end and after an error.
    // Valid until the next call of either.
    ByteSpan NextBlock();
    // Copies; fewer than count only at the end and after an error.
    std::size_t Read(void* to, std::size_t count);

    // Why reading on stopped before a codec had what it needed.
    std::string GetEndReason() const;

private:
    std::size_t ReadFile(unsigned char* to, std::size_t count, std::uint64_t offset);

    int mFile = -1;
    std::uint64_t mSize = 0;
    ByteSpan mMemory;
    MallocBytes mHead;
    std::size_t mHeadSize = 0;
    std::unique_ptr<unsigned char[]> mBlock;
    ByteSpan mRest; // of the current block
    std::uint64_t mOffset = 0;
    int mError = 0;
};

} // namespace Moka::detail

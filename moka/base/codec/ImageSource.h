// ImageSource: the bytes of one encoded image, from a file or from memory. A codec reads it sequentially or
// as a whole. Files are read, not mapped: if a file is truncated meanwhile, the result is a short read, not a
// signal.
// Owner:   owns the open file and the bytes read from it. Memory passed to OpenMemory must outlive this
//          object.
// Fails:   if the file cannot be opened, is not a regular file, or is larger than any valid image.
// Cost:    sequential reading keeps one block in memory; Prefix keeps all requested bytes.
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

    // The total size when it was opened.
    std::uint64_t GetSize() const { return mSize; }

    // Sets span to the first count bytes, or to fewer if there are no more. Returns false if reading fails or
    // memory runs out. Does not affect sequential reading. The span is valid until the next call of Prefix.
    bool Prefix(std::uint64_t count, ByteSpan& span, std::string& reason);

    // Sequential reading: returns the next block, of a suitable length; empty at the end and after an error.
    // The block is valid until the next call of NextBlock or Read.
    ByteSpan NextBlock();
    // Sequential reading: copies count bytes, or fewer at the end and after an error. Returns their number.
    std::size_t Read(void* to, std::size_t count);

    // Why sequential reading ended early: a read error, or a truncated file.
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

#include "moka/base/codec/ImageSource.h"

#include "moka/base/BitmapFactory.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <new>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace Moka::detail {
namespace {

constexpr std::size_t kBlockBytes = 65536;

// Encoded images are rarely larger than decoded ones. The 64 MiB are for metadata.
constexpr std::uint64_t kMaxFileBytes = BitmapFactory::kMaxBytes + (std::uint64_t{64} << 20);

} // namespace

ImageSource::~ImageSource() {
    if (mFile >= 0) close(mFile);
}

bool ImageSource::OpenFile(char const* path, std::string& reason) {
    // Without O_NONBLOCK, opening a pipe would wait for a writer before the pipe can be refused.
    mFile = open(path, O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    struct stat status = {};
    if (mFile < 0 || fstat(mFile, &status) != 0) {
        reason = std::strerror(errno);
        return false;
    }
    if (!S_ISREG(status.st_mode)) {
        reason = S_ISDIR(status.st_mode) ? "it is a folder" : "it is not a regular file";
        return false;
    }
    mSize = static_cast<std::uint64_t>(status.st_size);
    if (mSize > kMaxFileBytes) {
        reason = "the file has " + std::to_string(mSize) + " bytes, more than any image within the limits";
        return false;
    }
    return true;
}

void ImageSource::OpenMemory(void const* data, std::size_t size) {
    mMemory = {static_cast<unsigned char const*>(data), size};
    mSize = size;
}

bool ImageSource::Prefix(std::uint64_t count, ByteSpan& span, std::string& reason) {
    auto const wanted = static_cast<std::size_t>(std::min(count, mSize));
    if (mFile < 0) {
        span = {mMemory.data, wanted};
        return true;
    }
    if (wanted > mHeadSize) {
        auto* const grown = static_cast<unsigned char*>(std::realloc(mHead.get(), wanted));
        if (!grown) {
            reason = "not enough memory to read the file";
            return false;
        }
        static_cast<void>(mHead.release());
        mHead.reset(grown);
        mHeadSize += ReadFile(grown + mHeadSize, wanted - mHeadSize, mHeadSize);
        if (mError != 0) {
            reason = GetEndReason();
            return false;
        }
    }
    span = {mHead.get(), std::min(wanted, mHeadSize)};
    return true;
}

ByteSpan ImageSource::NextBlock() {
    if (mRest.size > 0) return std::exchange(mRest, ByteSpan{});
    if (mFile < 0) {
        ByteSpan const all{mMemory.data + mOffset, mMemory.size - static_cast<std::size_t>(mOffset)};
        mOffset = mMemory.size;
        return all;
    }
    if (!mBlock) mBlock.reset(new (std::nothrow) unsigned char[kBlockBytes]);
    if (!mBlock) {
        mError = ENOMEM;
        return {};
    }
    std::size_t const got = ReadFile(mBlock.get(), kBlockBytes, mOffset);
    mOffset += got;
    return {mBlock.get(), got};
}

std::size_t ImageSource::Read(void* to, std::size_t count) {
    auto* target = static_cast<unsigned char*>(to);
    std::size_t left = count;
    while (left > 0) {
        ByteSpan const block = NextBlock();
        std::size_t const taken = std::min(left, block.size);
        if (taken == 0) break;
        std::memcpy(target, block.data, taken);
        mRest = {block.data + taken, block.size - taken};
        target += taken;
        left -= taken;
    }
    return count - left;
}

std::string ImageSource::GetEndReason() const {
    return mError != 0 ? std::strerror(mError) : "the file is truncated";
}

std::size_t ImageSource::ReadFile(unsigned char* to, std::size_t count, std::uint64_t offset) {
    std::size_t done = 0;
    while (done < count && mError == 0) {
        ssize_t const got = pread(mFile, to + done, count - done, static_cast<off_t>(offset + done));
        if (got == 0) break;
        if (got > 0) {
            done += static_cast<std::size_t>(got);
        } else if (errno != EINTR) {
            mError = errno;
        }
    }
    return done;
}

} // namespace Moka::detail

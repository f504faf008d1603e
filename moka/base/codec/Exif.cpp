#include "moka/base/codec/Exif.h"

#include <cstring>

namespace Moka::detail {
namespace {

constexpr unsigned kOrientationTag = 0x0112;
constexpr unsigned kShortType = 3;
constexpr std::size_t kEntryBytes = 12;

// Reads a TIFF structure, whose header defines the byte order. Reading beyond its end returns 0.
class Tiff {
public:
    explicit Tiff(ByteSpan bytes) : mBytes(bytes) {
        mIsBigEndian = bytes.size >= 8 && std::memcmp(bytes.data, "MM\0*", 4) == 0;
        mIsValid = mIsBigEndian || (bytes.size >= 8 && std::memcmp(bytes.data, "II*\0", 4) == 0);
    }

    bool IsValid() const { return mIsValid; }
    unsigned Get16(std::size_t at) const {
        return mIsBigEndian ? Get8(at) << 8 | Get8(at + 1) : Get8(at + 1) << 8 | Get8(at);
    }
    std::size_t Get32(std::size_t at) const {
        return mIsBigEndian ? std::size_t{Get16(at)} << 16 | Get16(at + 2)
                            : std::size_t{Get16(at + 2)} << 16 | Get16(at);
    }

private:
    unsigned Get8(std::size_t at) const { return at < mBytes.size ? mBytes.data[at] : 0u; }

    ByteSpan mBytes;
    bool mIsBigEndian = false;
    bool mIsValid = false;
};

} // namespace

int ReadOrientation(ByteSpan exif) {
    if (exif.size >= 6 && std::memcmp(exif.data, "Exif\0\0", 6) == 0) exif = {exif.data + 6, exif.size - 6};
    Tiff const tiff(exif);
    if (!tiff.IsValid()) return 1;
    std::size_t const directory = tiff.Get32(4);
    for (std::size_t i = 0; i < tiff.Get16(directory); ++i) {
        std::size_t const entry = directory + 2 + i * kEntryBytes;
        if (tiff.Get16(entry) != kOrientationTag || tiff.Get16(entry + 2) != kShortType) continue;
        unsigned const value = tiff.Get16(entry + 8);
        return value >= 1 && value <= 8 ? static_cast<int>(value) : 1;
    }
    return 1;
}

} // namespace Moka::detail

// Decodes bytes as one kind of image file, in every way the library can: from memory, from a file, scaled,
// and the header alone. All must agree about what is there, and pixels must be premultiplied.
// FUZZ_FORMAT is the ImageFormat, so that the bytes of another kind are not looked at.
#include "fuzz/FuzzInput.h"
#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"

#include <memory>
#include <string>
#include <sys/mman.h>
#include <unistd.h>

namespace Moka::Fuzz {
namespace {

// What a larger image would show of faults is not worth its time.
constexpr int kMaxPixels = 1 << 18;
constexpr int kMaxTarget = 96;

// "mki" holds pixels as memory does, and they are taken as they are. WebP's note that there is no alpha is a
// hint, which the pixels may belie.
constexpr ImageFormat kFormat = ImageFormat::FUZZ_FORMAT;
constexpr bool kPremultiplies = kFormat != ImageFormat::Mki;
constexpr bool kKnowsAlpha = kFormat != ImageFormat::Webp;

using BitmapPtr = std::unique_ptr<Bitmap>;

// The path of a file in memory that holds the bytes until the next call.
String PutIntoFile(std::uint8_t const* data, std::size_t size) {
    static int const file = memfd_create("fuzz", 0);
    Require(ftruncate(file, 0) == 0 && pwrite(file, data, size, 0) == static_cast<ssize_t>(size),
            "no file in memory");
    return String("/proc/self/fd/" + std::to_string(file));
}

std::size_t CountBytes(Bitmap const& bitmap) {
    return static_cast<std::size_t>(bitmap.GetStride()) * static_cast<std::size_t>(bitmap.GetHeight());
}

void RequirePixels(Bitmap const& bitmap, bool hasAlpha) {
    Require(bitmap.GetStride() == bitmap.GetWidth() * 4, "rows have gaps");
    unsigned char const* const end = bitmap.GetBuffer() + CountBytes(bitmap);
    for (unsigned char const* p = bitmap.GetBuffer(); p != end; p += 4) {
        Require(!kPremultiplies || (p[0] <= p[3] && p[1] <= p[3] && p[2] <= p[3]),
                "a pixel is not premultiplied");
        Require(!kKnowsAlpha || hasAlpha || p[3] == 255, "a pixel of an opaque image is not opaque");
    }
}

void RequireSame(Bitmap const* a, Bitmap const* b) {
    Require((a == nullptr) == (b == nullptr), "only one of file and memory decodes");
    if (!a) return;
    Require(a->GetWidth() == b->GetWidth() && a->GetHeight() == b->GetHeight() &&
                std::memcmp(a->GetBuffer(), b->GetBuffer(), CountBytes(*a)) == 0,
            "file and memory decode differently");
}

void DecodeScaled(String const& path, bool decodes, bool hasAlpha, int width, int height) {
    BitmapPtr const scaled(BitmapFactory::CreateBitmap(&path, width, height));
    Require(decodes == static_cast<bool>(scaled), "the scaled image decodes, or the other, but not both");
    if (!scaled) return;
    Require(scaled->GetWidth() == width && scaled->GetHeight() == height, "not the size asked for");
    RequirePixels(*scaled, hasAlpha);
}

void DecodeAll(std::uint8_t const* data, std::size_t size) {
    String const path = PutIntoFile(data, size);
    ImageInfo info;
    bool const hasInfo = BitmapFactory::GetImageInfo(&path, &info);
    if (!hasInfo || info.format != kFormat) return;
    Require(info.width > 0 && info.width <= BitmapFactory::kMaxSide && info.height > 0 &&
                info.height <= BitmapFactory::kMaxSide && info.fileBytes == size,
            "what the header says is outside the limits");
    if (info.width > kMaxPixels / info.height) return;
    BitmapPtr const fromMemory(BitmapFactory::CreateBitmapFromMemory(data, size, "fuzz"));
    BitmapPtr const fromFile(BitmapFactory::CreateBitmapForGraphics(&path));
    RequireSame(fromMemory.get(), fromFile.get());
    if (fromFile) {
        Require(fromFile->GetWidth() == info.width && fromFile->GetHeight() == info.height,
                "the header says another size");
        RequirePixels(*fromFile, info.hasAlpha);
    }
    unsigned sum = 0;
    for (std::size_t i = 0; i < size; ++i) sum = sum * 31 + data[i];
    DecodeScaled(path, static_cast<bool>(fromFile), info.hasAlpha, 1 + static_cast<int>(sum % kMaxTarget),
                 1 + static_cast<int>(sum / kMaxTarget % kMaxTarget));
}

} // namespace
} // namespace Moka::Fuzz

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    Moka::Fuzz::DecodeAll(data, size);
    return 0;
}

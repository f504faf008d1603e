#include "moka/base/BitmapFactory.h"

#include "moka/base/Bitmap.h"
#include "moka/base/Log.h"
#include "moka/base/String.h"
#include "moka/base/Trace.h"
#include "moka/base/codec/ImageCodec.h"
#include "moka/base/log/AndroidLog.h"

#include <algorithm>
#include <new>

namespace Moka {
namespace {

using detail::ImageCodec;
using detail::ImageSource;
using detail::PixelSize;

constexpr ImageCodec const* kCodecs[] = {&detail::kPngCodec, &detail::kJpegCodec, &detail::kWebpCodec,
                                         &detail::kMkiCodec};

struct Extension {
    char const* text;
    ImageFormat format;
};
constexpr Extension kExtensions[] = {{"png", ImageFormat::Png},
                                     {"jpg", ImageFormat::Jpeg},
                                     {"jpeg", ImageFormat::Jpeg},
                                     {"webp", ImageFormat::Webp},
                                     {"mki", ImageFormat::Mki}};

std::string LastComponent(std::string const& path) { return path.substr(path.rfind('/') + 1); }

std::string Printable(std::string const& path) {
    std::string name = Log::ConvertSecureLog(path);
    for (char& c : name) {
        if (static_cast<unsigned char>(c) < ' ' || c == 0x7F) c = '?';
    }
    return name;
}

void LogFailure(char const* action, std::string const& path, std::string const& reason) {
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "cannot %s image '%s': %s", action,
                        Printable(path).c_str(), reason.c_str());
}

// Logs the failure and passes the reason to the caller.
void Fail(char const* action, std::string const& path, std::string& reason, std::string* told) {
    LogFailure(action, path, reason);
    if (told) told->swap(reason);
}

void TellNoMemory(std::string* told) noexcept {
    if (!told) return;
    try {
        *told = "not enough memory";
    } catch (std::bad_alloc const&) {
        told->clear();
    }
}

// Logs a warning for an image that was read although its colour profile could not be used.
void LogIgnoredProfile(std::string const& path, std::string const& reason) {
    __android_log_print(ANDROID_LOG_WARN, "mok_log", "image '%s': its colour profile is ignored: %s",
                        Printable(path).c_str(), reason.c_str());
}

// Calls function and treats bad_alloc, which strings and codecs throw, like any other failure.
template <class Function>
auto Attempt(char const* action, std::string* told, Function const& function) -> decltype(function()) {
    try {
        return function();
    } catch (std::bad_alloc const&) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "cannot %s image: not enough memory", action);
        TellNoMemory(told);
        return {};
    }
}

bool ToPath(String const* text, std::string& path, std::string& reason) {
    if (text) path = text->ToFileName();
    if (path.empty()) {
        reason = "no path is given";
    } else if (path.find('\0') != std::string::npos) {
        reason = "the path has a zero byte in it";
    }
    return reason.empty();
}

ImageCodec const* FindCodec(ImageSource& source, std::string& reason) {
    detail::ByteSpan head;
    if (!source.Prefix(detail::kSignatureBytes, head, reason)) return nullptr;
    for (ImageCodec const* codec : kCodecs) {
        if (codec->matches(head)) return codec;
    }
    reason = head.size == 0 ? "the file is empty" : "it is not a PNG, JPEG, WebP or mki file";
    return nullptr;
}

Bitmap* Wrap(unsigned char* buffer, PixelSize size, int stride, int format, bool deleteBuffer) {
    std::unique_ptr<Bitmap> bitmap(new (std::nothrow) Bitmap);
    if (!bitmap || !bitmap->Construct(buffer, size.width, size.height, stride, format, false, deleteBuffer)) {
        return nullptr;
    }
    return bitmap.release();
}

char const* NameOf(ImageFormat format) {
    for (Extension const& known : kExtensions) {
        if (known.format == format) return known.text;
    }
    return "unknown";
}

void Describe(TraceScope& trace, ImageFormat format, PixelSize size) {
    trace.Set("format", NameOf(format));
    trace.Set("width", static_cast<std::uint64_t>(size.width));
    trace.Set("height", static_cast<std::uint64_t>(size.height));
}

Bitmap* Decode(ImageSource& source, PixelSize target, std::string& reason) {
    TraceScope trace("image", "load");
    detail::PixelBuffer image;
    ImageCodec const* const codec = FindCodec(source, reason);
    if (!codec || !codec->decode(source, target, image, reason)) return nullptr;
    Describe(trace, codec->format, image.size);
    Bitmap* const bitmap = Wrap(image.pixels.get(), image.size, static_cast<int>(image.GetStride()),
                                Bitmap::kFormatRgba8888, true);
    if (bitmap) {
        static_cast<void>(image.pixels.release());
    } else {
        reason = "not enough memory";
    }
    return bitmap;
}

Bitmap* DecodeFile(String const* text, PixelSize target, std::string* told) {
    std::string path;
    std::string reason;
    ImageSource source;
    bool const isOpen = ToPath(text, path, reason) && source.OpenFile(path.c_str(), reason);
    Bitmap* const bitmap = isOpen ? Decode(source, target, reason) : nullptr;
    if (!bitmap) Fail("read", path, reason, told);
    if (bitmap && !reason.empty()) LogIgnoredProfile(path, reason);
    return bitmap;
}

std::string ExtensionOf(std::string const& path) {
    std::string const name = LastComponent(path);
    std::size_t const dot = name.rfind('.');
    if (dot == std::string::npos) return {};
    std::string extension = name.substr(dot + 1);
    // Does not use tolower, which depends on the process's locale.
    for (char& c : extension) {
        if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
    }
    return extension;
}

ImageFormat FormatOf(std::string const& path) {
    std::string const extension = ExtensionOf(path);
    for (Extension const& known : kExtensions) {
        if (extension == known.text) return known.format;
    }
    return ImageFormat::Unknown;
}

bool FindEncoder(std::string const& path, ImageCodec const*& codec, std::string& reason) {
    ImageFormat const format = FormatOf(path);
    for (ImageCodec const* candidate : kCodecs) {
        if (candidate->format == format) codec = candidate;
    }
    if (!codec) reason = "unknown extension '" + ExtensionOf(path) + "'; use png, jpg, jpeg, webp or mki";
    return codec != nullptr;
}

bool ToView(Bitmap const* bitmap, detail::PixelView& view, std::string& reason) {
    if (!bitmap || !bitmap->GetBuffer()) {
        reason = "there are no pixels to save";
        return false;
    }
    view = {bitmap->GetBuffer(),
            {bitmap->GetWidth(), bitmap->GetHeight()},
            static_cast<std::size_t>(bitmap->GetStride())};
    return detail::CheckSize(view.size.width, view.size.height, reason);
}

bool Save(Bitmap const* bitmap, std::string const& path, int quality, std::string& reason) {
    detail::PixelView view{};
    ImageCodec const* codec = nullptr;
    TraceScope trace("image", "save");
    if (!FindEncoder(path, codec, reason) || !ToView(bitmap, view, reason)) return false;
    Describe(trace, codec->format, view.size);
    detail::AtomicFile file;
    bool const isSaved = file.Open(path) && codec->encode(view, quality, file, reason) && file.Commit();
    // If writing the file failed, the codec's message is only a consequence.
    if (!isSaved && !file.GetReason().empty()) reason = file.GetReason();
    return isSaved;
}

} // namespace

Bitmap* BitmapFactory::CreateBitmap(String const* path, int width, int height) {
    return CreateBitmap(path, width, height, nullptr);
}

Bitmap* BitmapFactory::CreateBitmap(String const* path, int width, int height, std::string* reason) {
    return Attempt("read", reason, [&]() -> Bitmap* {
        std::string wrong;
        if (detail::CheckSize(width, height, wrong)) return DecodeFile(path, {width, height}, reason);
        wrong.insert(0, "the requested size, ");
        Fail("read", path ? path->ToUtf8() : std::string(), wrong, reason);
        return nullptr;
    });
}

Bitmap* BitmapFactory::CreateBitmapForGraphics(String const* path) {
    return CreateBitmapForGraphics(path, nullptr);
}

Bitmap* BitmapFactory::CreateBitmapForGraphics(String const* path, std::string* reason) {
    return Attempt("read", reason, [&] { return DecodeFile(path, {}, reason); });
}

Bitmap* BitmapFactory::CreateBitmapFromMemory(void const* data, std::size_t size, char const* name) {
    return Attempt("read", nullptr, [&] {
        std::string reason;
        ImageSource source;
        source.OpenMemory(data, data ? size : 0);
        Bitmap* const bitmap = Decode(source, {}, reason);
        if (!bitmap) LogFailure("read", name ? name : "", reason);
        if (bitmap && !reason.empty()) LogIgnoredProfile(name ? name : "", reason);
        return bitmap;
    });
}

Bitmap* BitmapFactory::CreateBitmapFromBuffer(unsigned char* buffer, int width, int height, int stride,
                                              int format, bool deleteBuffer) {
    Bitmap* const bitmap = Wrap(buffer, {width, height}, stride, format, deleteBuffer);
    if (!bitmap) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "cannot wrap image 'pixels': %d x %d, stride %d, format %d%s", width, height,
                            stride, format, buffer ? " is not a picture" : " without a buffer");
    }
    return bitmap;
}

bool BitmapFactory::SaveBitmap(Bitmap const* bitmap, String const* path, int quality) {
    return SaveBitmap(bitmap, path, quality, nullptr);
}

bool BitmapFactory::SaveBitmap(Bitmap const* bitmap, String const* path, int quality, std::string* reason) {
    return Attempt("save", reason, [&] {
        std::string text;
        std::string wrong;
        bool const isSaved =
            ToPath(path, text, wrong) && Save(bitmap, text, std::clamp(quality, 0, 100), wrong);
        if (!isSaved) Fail("save", text, wrong, reason);
        return isSaved;
    });
}

bool BitmapFactory::GetImageInfo(String const* path, ImageInfo* info) {
    return GetImageInfo(path, info, nullptr);
}

bool BitmapFactory::GetImageInfo(String const* path, ImageInfo* info, std::string* reason) {
    return Attempt("read", reason, [&] {
        std::string text;
        std::string wrong;
        ImageSource source;
        ImageInfo found;
        bool const isOpen = ToPath(path, text, wrong) && source.OpenFile(text.c_str(), wrong);
        ImageCodec const* const codec = isOpen ? FindCodec(source, wrong) : nullptr;
        if (!codec || !codec->readInfo(source, found, wrong)) {
            Fail("read", text, wrong, reason);
            return false;
        }
        found.format = codec->format;
        found.fileBytes = source.GetSize();
        if (info) *info = found;
        return true;
    });
}

ImageFormat BitmapFactory::GetFormatByExtension(String const* path) {
    return Attempt("name", nullptr, [&] { return path ? FormatOf(path->ToUtf8()) : ImageFormat::Unknown; });
}

char const* BitmapFactory::GetFormatName(ImageFormat format) {
    switch (format) {
    case ImageFormat::Png:
        return "PNG";
    case ImageFormat::Jpeg:
        return "JPEG";
    case ImageFormat::Webp:
        return "WebP";
    case ImageFormat::Mki:
        return "mki";
    case ImageFormat::Unknown:
        break;
    }
    return "unknown";
}

} // namespace Moka

/// BitmapsAndCanvases: functions that call MKGraphicsFactory and return reference-counted pointers.
///     auto bitmap = NewBitmap(*queue, 400, 400);
///     auto canvas = NewCanvas(*queue, bitmap);
///     canvas->DrawCircle(200, 200, 100, nullptr);
///     SaveBitmap(*bitmap, "circle.png");
/// Owner:  the returned pointer holds the first reference; copies of it hold more.
/// Thread: UseFrom selects the threads that use the result. With AnyThread any thread may call, and the work
///         is posted to queue. With RenderThread only the render thread of queue may call. ReadBitmap and
///         SaveBitmap wait for the render thread, so a task must not call them with a bitmap for AnyThread.
/// Units:  pixels; RGBA8, premultiplied. Paths are the bytes of a file's name.
/// Fails:  return null or false and log an error, as MKGraphicsFactory and BitmapFactory do. With a null
///         bitmap the canvas is null.
#pragma once

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/Rect.h"
#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/graphics/task/IGLMsgQueue.h"

#include <algorithm>
#include <cstddef>
#include <memory>
#include <new>
#include <string>
#include <utility>

namespace Moka {

/// The threads that an object is used from. The values are those of the factory's parameter useQueue.
enum class UseFrom { RenderThread, AnyThread };

/// Creates a bitmap from tightly packed pixels. The caller keeps them valid until the render thread has
/// uploaded them.
inline RefPtr<IMKBitmap> NewBitmap(IGLMsgQueue& queue, int width, int height, void const* pixels,
                                   UseFrom from = UseFrom::AnyThread) {
    return RefPtr<IMKBitmap>::Adopt(
        MKGraphicsFactory::CreateBitmap(&queue, width, height, pixels, false, static_cast<int>(from), false));
}

/// Creates a transparent bitmap.
inline RefPtr<IMKBitmap> NewBitmap(IGLMsgQueue& queue, int width, int height,
                                   UseFrom from = UseFrom::AnyThread) {
    return NewBitmap(queue, width, height, nullptr, from);
}

/// Creates a bitmap from an image and takes ownership of its pixels. They are copied only if image does not
/// own them, or if its rows are not tightly packed. If image is null, returns null and logs nothing.
inline RefPtr<IMKBitmap> NewBitmap(IGLMsgQueue& queue, std::unique_ptr<Bitmap> image,
                                   UseFrom from = UseFrom::AnyThread) {
    if (!image) return {};
    if (!image->GetDeleteBuffer() || image->GetStride() != image->GetWidth() * 4) {
        std::unique_ptr<Bitmap> copy(new (std::nothrow) Bitmap);
        if (!copy || !copy->Construct(image->GetBuffer(), image->GetWidth(), image->GetHeight(),
                                      image->GetStride(), image->GetFormat(), true, true))
            return {};
        image = std::move(copy);
    }
    auto bitmap = RefPtr<IMKBitmap>::Adopt(
        MKGraphicsFactory::CreateBitmap(&queue, image->GetWidth(), image->GetHeight(), image->GetBuffer(),
                                        true, static_cast<int>(from), false));
    if (bitmap) image->SetDeleteBuffer(false);
    return bitmap;
}

/// Creates a bitmap that draws into the host's default frame buffer, for instance that of a window.
inline RefPtr<IMKBitmap> NewScreenBitmap(IGLMsgQueue& queue, int width, int height,
                                         UseFrom from = UseFrom::AnyThread) {
    return RefPtr<IMKBitmap>::Adopt(
        MKGraphicsFactory::CreateScreenBitmap(&queue, 0, 0, width, height, 1, static_cast<int>(from)));
}

/// Creates a bitmap that shares the image of parent, and keeps parent alive.
inline RefPtr<IMKBitmap> NewSharedBitmap(IGLMsgQueue& queue, RefPtr<IMKBitmap> const& parent,
                                         UseFrom from = UseFrom::AnyThread) {
    return RefPtr<IMKBitmap>::Adopt(
        MKGraphicsFactory::CreateBitmap(&queue, parent.Get(), static_cast<int>(from)));
}

/// Creates a canvas that draws into target and keeps it alive.
inline RefPtr<IMKCanvas> NewCanvas(IGLMsgQueue& queue, IMKBitmap* target, UseFrom from = UseFrom::AnyThread) {
    return RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&queue, target, static_cast<int>(from)));
}
/// The same, for a reference-counted pointer.
inline RefPtr<IMKCanvas> NewCanvas(IGLMsgQueue& queue, RefPtr<IMKBitmap> const& target,
                                   UseFrom from = UseFrom::AnyThread) {
    return NewCanvas(queue, target.Get(), from);
}

/// Creates a canvas for external GL code that draws into target, and keeps target alive.
inline RefPtr<IMKPenCanvas> NewPenCanvas(IGLMsgQueue& queue, IMKBitmap* target,
                                         UseFrom from = UseFrom::AnyThread) {
    return RefPtr<IMKPenCanvas>::Adopt(
        MKGraphicsFactory::CreatePenCanvas(&queue, target, static_cast<int>(from)));
}
/// The same, for a reference-counted pointer.
inline RefPtr<IMKPenCanvas> NewPenCanvas(IGLMsgQueue& queue, RefPtr<IMKBitmap> const& target,
                                         UseFrom from = UseFrom::AnyThread) {
    return NewPenCanvas(queue, target.Get(), from);
}

/// Loads a PNG, JPEG, WebP or mki file into a bitmap. The base library decodes it on the calling thread, even
/// if Java has a decoder. If the file cannot be decoded, *reason is set, if it is given.
inline RefPtr<IMKBitmap> LoadBitmap(IGLMsgQueue& queue, std::string const& path,
                                    std::string* reason = nullptr, UseFrom from = UseFrom::AnyThread) {
    String const name = String::FromFileName(path);
    std::unique_ptr<Bitmap> image(BitmapFactory::CreateBitmapForGraphics(&name, reason));
    return NewBitmap(queue, std::move(image), from);
}

/// Reads the bitmap's pixels, after waiting for everything that was posted before. Returns null if memory
/// runs out, or if the queue refuses the task, for instance because it was stopped.
inline std::unique_ptr<Bitmap> ReadBitmap(IMKBitmap& bitmap) {
    int const width = bitmap.GetWidth();
    int const height = bitmap.GetHeight();
    if (width < 1 || height < 1) return nullptr;
    std::size_t const bytes = static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 4;
    std::unique_ptr<unsigned char[]> pixels(new (std::nothrow) unsigned char[bytes]());
    std::unique_ptr<Bitmap> image(new (std::nothrow) Bitmap);
    if (!pixels || !image) return nullptr;
    bitmap.GetBitmapData(bitmap.GetBitmapRect(), pixels.get());
    // GetBitmapData does not report failure. So read one pixel again, over a different value: if that value
    // is still there afterwards, nothing was read.
    unsigned char opposite[4];
    unsigned char probe[4];
    for (std::size_t i = 0; i < 4; ++i) opposite[i] = probe[i] = static_cast<unsigned char>(~pixels[i]);
    Rect const all = bitmap.GetBitmapRect();
    bitmap.GetBitmapData(Rect(all.left, all.top, all.left + 1, all.top + 1), probe);
    if (std::equal(probe, probe + 4, opposite)) return nullptr;
    if (image->Construct(pixels.get(), width, height, width * 4, Bitmap::kFormatRgba8888, false, true))
        static_cast<void>(pixels.release());
    return image;
}

/// Saves the bitmap to a file, in the format of the path's extension. See BitmapFactory::SaveBitmap for
/// quality. If it cannot be saved, *reason is set, if it is given.
inline bool SaveBitmap(IMKBitmap& bitmap, std::string const& path, int quality = 100,
                       std::string* reason = nullptr) {
    std::unique_ptr<Bitmap> const image = ReadBitmap(bitmap);
    if (!image) {
        if (reason) *reason = "the bitmap cannot be read back: its queue refuses, or memory has run out";
        return false;
    }
    String const name = String::FromFileName(path);
    return BitmapFactory::SaveBitmap(image.get(), &name, quality, reason);
}

} // namespace Moka

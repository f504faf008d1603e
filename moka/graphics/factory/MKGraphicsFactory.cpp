#include "moka/graphics/factory/MKGraphicsFactory.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/graphics/bitmap/BitmapCreation.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/bitmap/MKTextureBitmap.h"
#include "moka/graphics/canvas/MKCanvas.h"
#include "moka/graphics/canvas/MKCanvasRT.h"
#include "moka/graphics/canvas/MKPenCanvas.h"
#include "moka/graphics/canvas/MKPenCanvasRT.h"
#include "moka/graphics/task/WorkerTask.h"

#include <memory>
#include <new>

namespace Moka {
namespace {

bool CanPost(IGLMsgQueue* queue, int useQueue) { return queue || useQueue == 0; }

} // namespace

IMKBitmap* MKGraphicsFactory::CreateBitmap(IGLMsgQueue* queue, int width, int height, void const* pixels,
                                           bool deleteBuffer, int useQueue, bool textureFlag) {
    return detail::CreateTextureBitmap(queue, width, height, pixels, deleteBuffer, useQueue, textureFlag);
}

IMKBitmap* MKGraphicsFactory::CreateBitmap(IGLMsgQueue* queue, Rect const& region, int width, int height,
                                           void const* pixels, int useQueue) {
    if (!detail::IsValidBitmap(queue, width, height)) return nullptr;
    Rect const clipped = region.Intersect(Rect(0, 0, width, height));
    if (clipped.IsEmpty()) return nullptr;
    // Here useQueue selects the owner of the pixels, and the strips are always caller-side.
    return new (std::nothrow) MKTextureBitmap(queue, clipped, width, height, pixels, useQueue == 0, false);
}

IMKBitmap* MKGraphicsFactory::CreateBitmap(IGLMsgQueue* queue, IMKBitmap* parent, int useQueue) {
    return detail::CreateSharedBitmap(queue, parent, useQueue);
}

IMKBitmap* MKGraphicsFactory::CreateBitmap(IGLMsgQueue* queue, String const* path, int useQueue) {
    return CreateBitmap(queue, path, 0, 0, useQueue);
}

IMKBitmap* MKGraphicsFactory::CreateBitmap(IGLMsgQueue* queue, String const* path, int width, int height,
                                           int useQueue) {
    std::unique_ptr<Bitmap> const decoded(detail::DecodeFile(path, width, height));
    if (!decoded) return nullptr;
    // The texture bitmap gets the buffer. If the request is refused below, the buffer leaks.
    decoded->SetDeleteBuffer(false);
    if (!detail::IsValidBitmap(queue, decoded->GetWidth(), decoded->GetHeight())) return nullptr;
    IMKBitmap* const bitmap = new (std::nothrow) MKTextureBitmap(
        queue, decoded->GetWidth(), decoded->GetHeight(), decoded->GetBuffer(), true, useQueue == 0, false);
    if (!bitmap) decoded->SetDeleteBuffer(true);
    return bitmap;
}

IMKBitmap* MKGraphicsFactory::CreateBitmap(IGLMsgQueue* queue, Rect const& region, String const* path,
                                           int useQueue) {
    std::unique_ptr<Bitmap> const decoded(BitmapFactory::CreateBitmapForGraphics(path));
    if (!decoded) return nullptr;
    unsigned char const* const pixels = decoded->GetBuffer();
    IMKBitmap* const bitmap =
        CreateBitmap(queue, region, decoded->GetWidth(), decoded->GetHeight(), pixels, useQueue);
    if (!bitmap) return nullptr;
    // The uploads have not run yet, so the array is freed by a task after them. If the bitmap owns the pixels
    // it posts that task itself.
    decoded->SetDeleteBuffer(false);
    if (useQueue != 0) WorkerTask::PostDeleteArray(queue, pixels);
    return bitmap;
}

IMKBitmap* MKGraphicsFactory::CreateBitmap(IGLMsgQueue* queue, TextureObject const* texture, int useQueue) {
    if (!texture) return nullptr;
    return new (std::nothrow) MKTextureBitmap(queue, texture, useQueue == 0);
}

Bitmap* MKGraphicsFactory::CreateScaledCPUBitmap(String const* path, int width, int height) {
    return detail::DecodeFile(path, width, height);
}

IMKBitmap* MKGraphicsFactory::CreateScreenBitmap(IGLMsgQueue* queue, int x, int y, int width, int height,
                                                 int useDefaultFramebuffer, int useQueue) {
    return detail::CreateScreenBitmap(queue, x, y, width, height, useDefaultFramebuffer, useQueue);
}

void MKGraphicsFactory::RefBitmap(IMKBitmap* bitmap) {
    if (bitmap) bitmap->Ref();
}

void MKGraphicsFactory::ReleaseBitmap(IMKBitmap* bitmap) {
    if (bitmap) bitmap->Unref();
}

IMKCanvas* MKGraphicsFactory::CreateCanvas(IGLMsgQueue* queue, IMKBitmap* target, int useQueue) {
    if (!target || !CanPost(queue, useQueue)) return nullptr;
    if (useQueue == 0) return new (std::nothrow) MKCanvasRT(queue, target);
    return new (std::nothrow) MKCanvas(queue, target);
}

IMKPenCanvas* MKGraphicsFactory::CreatePenCanvas(IGLMsgQueue* queue, IMKBitmap* target, int useQueue) {
    if (!target || !CanPost(queue, useQueue)) return nullptr;
    if (useQueue == 0) return new (std::nothrow) MKPenCanvasRT(queue, target);
    return new (std::nothrow) MKPenCanvas(queue, target);
}

void MKGraphicsFactory::RefCanvas(IMKCanvasBase* canvas) {
    if (canvas) canvas->Ref();
}

void MKGraphicsFactory::ReleaseCanvas(IMKCanvasBase* canvas) {
    if (canvas) canvas->Unref();
}

} // namespace Moka

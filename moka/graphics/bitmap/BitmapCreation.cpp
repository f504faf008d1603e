#include "moka/graphics/bitmap/BitmapCreation.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/MKScreenBitmap.h"
#include "moka/graphics/bitmap/MKScreenBitmapRT.h"
#include "moka/graphics/bitmap/MKSharedTextureBitmap.h"

#include <new>

namespace Moka::detail {
namespace {

void LogInvalidParent(IMKBitmap* parent, char const* tag) {
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "%s, invalid parent bitmap (%p:\"%s\")", "CreateBitmap",
                        static_cast<void*>(parent), tag);
}

} // namespace

bool IsValidBitmap(IGLMsgQueue* queue, int width, int height) {
    if (queue && width >= 1 && height >= 1) return true;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "%s, bitmap is not created!, bitmap width = %d, height = %d, queue=%p",
                        "CreateBitmap", width, height, static_cast<void*>(queue));
    return false;
}

IMKBitmap* CreateTextureBitmap(IGLMsgQueue* queue, int width, int height, void const* pixels,
                               bool deleteBuffer, int useQueue, bool textureFlag) {
    if (!IsValidBitmap(queue, width, height)) return nullptr;
    return new (std::nothrow)
        MKTextureBitmap(queue, width, height, pixels, deleteBuffer, useQueue == 0, textureFlag);
}

IMKBitmap* CreateSharedBitmap(IGLMsgQueue* queue, IMKBitmap* parent, int useQueue) {
    if (!parent) {
        LogInvalidParent(parent, "---");
        return nullptr;
    }
    if (!parent->GetTextureBitmap()) {
        LogInvalidParent(parent, parent->GetTag());
        return nullptr;
    }
    if (!queue && useQueue != 0) return nullptr;
    return new (std::nothrow) MKSharedTextureBitmap(queue, parent, useQueue == 0);
}

IMKBitmap* CreateScreenBitmap(IGLMsgQueue* queue, int x, int y, int width, int height,
                              int useDefaultFramebuffer, int useQueue) {
    auto const type =
        useDefaultFramebuffer != 0 ? MKBitmap::DefaultFramebuffer : MKBitmap::CurrentFramebuffer;
    if (!queue && useQueue != 0) return nullptr;
    if (useQueue == 0) return new (std::nothrow) MKScreenBitmapRT(queue, x, y, width, height, type);
    return new (std::nothrow) MKScreenBitmap(queue, x, y, width, height, type);
}

} // namespace Moka::detail

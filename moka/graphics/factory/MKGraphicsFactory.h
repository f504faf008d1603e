/// MKGraphicsFactory: the entry point. It creates bitmaps and canvases.
/// Owner:  the caller gets one reference on each result and drops it with ReleaseBitmap or ReleaseCanvas. The
///         caller deletes a CPU bitmap.
/// Thread: any; the factory has no state. useQueue selects the flavour. If it is not 0, the object is
///         caller-side: any thread may use it, and its work is posted to queue. If it is 0, the object must
///         be created and used on the render thread only.
/// Units:  pixels; RGBA8, premultiplied.
/// Fails:  returns null. Invalid arguments, and a file that cannot be decoded, log an error.
///
/// With a null queue:
///     from pixels or a file, whole or a region   null; logs the error of an invalid size
///     from a parent                              an invalid parent: null, logs an error; otherwise
///     caller-side: null,
///                                                logs nothing; render-thread: created
///     of a screen; canvas, pen canvas            caller-side: null, logs nothing; render-thread: created
///     from a texture                             created: without strips it never posts
/// A bitmap created without a queue cannot be cloned, because clones are caller-side. A canvas created
/// without a queue cannot draw bitmaps with Darken or Lighten.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/Rect.h"

namespace Moka {

class Bitmap;
class IGLMsgQueue;
class IMKBitmap;
class IMKCanvas;
class IMKCanvasBase;
class IMKPenCanvas;
class String;
class TextureObject; ///< an opaque texture of the platform; only compared with null

class MOKA_API MKGraphicsFactory {
public:
    /// Creates a bitmap from tightly packed pixels, or a transparent one if pixels is null. The pixels must
    /// stay valid until the render thread has uploaded them. With deleteBuffer the bitmap takes ownership of
    /// them; they must come from `new unsigned char[]`. textureFlag has no effect.
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, int width, int height, void const* pixels,
                                   bool deleteBuffer, int useQueue, bool textureFlag);

    /// Creates a bitmap of the full size width x height, but uploads only the part inside region, at its
    /// place. Returns null if region does not overlap the image. The result is always caller-side. With
    /// useQueue 0 the bitmap takes ownership of the pixels.
    // Compat: region-creation
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, Rect const& region, int width, int height,
                                   void const* pixels, int useQueue);

    /// Creates a bitmap that shares the image of parent, and keeps parent alive.
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, IMKBitmap* parent, int useQueue);

    /// Creates a bitmap from an image file: in its own size, or scaled to width x height if neither is 0.
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, String const* path, int useQueue);
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, String const* path, int width, int height,
                                   int useQueue);

    /// Creates a bitmap from the part of an image file inside region. The base library decodes all formats
    /// here.
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, Rect const& region, String const* path, int useQueue);

    /// Creates an empty bitmap of size zero. Returns null if texture is null.
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, TextureObject const* texture, int useQueue);

    /// Loads an image file into CPU memory, scaled to width x height if neither is 0.
    static Bitmap* CreateScaledCPUBitmap(String const* path, int width, int height);

    /// Creates a bitmap that draws into the host's default frame buffer, or with useDefaultFramebuffer 0 into
    /// the frame buffer that is bound when the bitmap is created on the render thread. The arguments are not
    /// validated. Clips that need the stencil do not work on it.
    static IMKBitmap* CreateScreenBitmap(IGLMsgQueue* queue, int x, int y, int width, int height,
                                         int useDefaultFramebuffer, int useQueue);

    /// Take and drop a reference. Null bitmaps are ignored.
    static void RefBitmap(IMKBitmap* bitmap);
    static void ReleaseBitmap(IMKBitmap* bitmap);

    /// Creates a canvas that draws into target. If target is null, returns null and logs nothing.
    static IMKCanvas* CreateCanvas(IGLMsgQueue* queue, IMKBitmap* target, int useQueue);
    /// Creates a canvas for external GL code that draws into target, which must be a texture bitmap. With
    /// another bitmap it logs an error, and the canvas does nothing. If target is null, returns null and logs
    /// nothing.
    static IMKPenCanvas* CreatePenCanvas(IGLMsgQueue* queue, IMKBitmap* target, int useQueue);

    /// Take and drop a reference. Null canvases are ignored.
    static void RefCanvas(IMKCanvasBase* canvas);
    static void ReleaseCanvas(IMKCanvasBase* canvas);
};

} // namespace Moka

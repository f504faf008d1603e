/// MKGraphicsFactory: the entry point. It creates bitmaps and canvases.
/// Owner:  each result carries one reference for the caller, released with ReleaseBitmap or ReleaseCanvas; a
///         CPU bitmap is the caller's to delete.
/// Thread: any; no state. useQueue chooses the flavour: not 0 creates caller-side objects, usable from any
///         thread, whose work is posted to queue; 0 creates render-thread objects, to be created and used
///         there only.
/// Units:  pixels; RGBA8, premultiplied.
/// Fails:  null; an invalid request, and a file that cannot be decoded, log an error.
///
/// Without a queue:
///     from pixels or a file, whole or a region   null, and the error line of an invalid size
///     over a parent                              a bad parent is null with its error line; else caller-side
///                                                null without a line, render-thread made
///     over a screen; canvas, pen canvas          caller-side null without a line, render-thread made
///     from a texture                             made: without strips it never posts
/// A bitmap created without a queue has no clone, since clones are caller-side. A canvas without one cannot
/// darken or lighten bitmaps.
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
class TextureObject; ///< an opaque texture of the platform; only its presence is looked at

class MOKA_API MKGraphicsFactory {
public:
    /// From tightly packed pixels, or transparent when they are null. They stay valid until the render thread
    /// has uploaded them; with deleteBuffer the bitmap owns them from here on, a `new unsigned char[]`.
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, int width, int height, void const* pixels,
                                   bool deleteBuffer, int useQueue, bool textureFlag);

    /// The part of such an image that region covers, at its place in a bitmap of the full size; null when it
    /// covers none. The result is always caller-side; useQueue 0 means that the bitmap owns the pixels.
    // Compat: region-creation
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, Rect const& region, int width, int height,
                                   void const* pixels, int useQueue);

    /// Over the image of parent, which it keeps alive.
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, IMKBitmap* parent, int useQueue);

    /// From a file: at its own size, or scaled when neither width nor height is 0.
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, String const* path, int useQueue);
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, String const* path, int width, int height,
                                   int useQueue);

    /// The part of a file's image that region covers; decoded by the base library for every extension.
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, Rect const& region, String const* path, int useQueue);

    /// An empty bitmap of size zero; null when texture is.
    static IMKBitmap* CreateBitmap(IGLMsgQueue* queue, TextureObject const* texture, int useQueue);

    /// In CPU memory; scaled when neither width nor height is 0.
    static Bitmap* CreateScaledCPUBitmap(String const* path, int width, int height);

    /// Over the host's default frame buffer, or with useDefaultFramebuffer 0 over the one bound when it is
    /// made. Nothing is validated. Clips that need the stencil do not work on it.
    static IMKBitmap* CreateScreenBitmap(IGLMsgQueue* queue, int x, int y, int width, int height,
                                         int useDefaultFramebuffer, int useQueue);

    /// Null bitmaps are ignored.
    static void RefBitmap(IMKBitmap* bitmap);
    static void ReleaseBitmap(IMKBitmap* bitmap);

    /// Null, without a message, when target is null. A pen canvas needs a texture bitmap; on another one it
    /// is created, logs an error, and draws nothing.
    static IMKCanvas* CreateCanvas(IGLMsgQueue* queue, IMKBitmap* target, int useQueue);
    static IMKPenCanvas* CreatePenCanvas(IGLMsgQueue* queue, IMKBitmap* target, int useQueue);

    /// Null canvases are ignored.
    static void RefCanvas(IMKCanvasBase* canvas);
    static void ReleaseCanvas(IMKCanvasBase* canvas);
};

} // namespace Moka

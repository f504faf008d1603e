/// CustomDrawable: the base class of the library's custom drawables. It holds the bitmaps to draw, and
/// creates and releases the GPU objects on the render thread. The drawable itself may be created and deleted
/// on any thread.
/// Owner:  reference counted. The creator holds the first reference, and the task that creates the GPU
///         objects one more. If the queue refuses that task, the drawable draws nothing and is never deleted.
///         If the queue refuses the release of a GPU object, that object leaks.
/// Thread: construction, destruction and setters on the caller's thread, DrawRT on the render thread. Setters
///         are not synchronised. They also affect draws that are posted but not yet run.
/// Fails:  silently: without GPU objects, or without a bitmap that can be sampled, DrawRT does nothing.
// Compat: refused-post
#pragma once

#include "moka/base/RefCount.h"
#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/drawable/IMKCustomDrawable.h"
#include "moka/renderer/IGraphicsObject.h"
#include "moka/renderer/VertexDescriptor.h"

#include <memory>

namespace Moka::detail {

/// Not exported: callers reach its members through derived classes, and those members are inline or virtual.
template <class Shader>
class CustomDrawable : public IMKCustomDrawable, private RefCount {
public:
    ~CustomDrawable() override;
    /// Take or drop a reference. The last Unref deletes the drawable.
    int Ref() override { return RefCount::Ref(); }
    int Unref() override { return RefCount::Unref(); }

protected:
    /// Posts the creation of the GPU objects. Without a queue there are none.
    CustomDrawable(IGLMsgQueue* queue, PrimitiveType primitive, VertexDescriptor const& vertex);

    /// Stores bitmap in held and takes a reference on it, unless it is stored already. Null stores none.
    static void Hold(RefPtr<IMKBitmap>& held, IMKBitmap* bitmap) {
        if (held.Get() != bitmap) held = RefPtr<IMKBitmap>::Share(bitmap);
    }
    /// The bitmap's interface for sampling. Null if there is no bitmap or it cannot be sampled.
    static IMKBitmapReadable* GetReadable(RefPtr<IMKBitmap> const& bitmap);

    /// True if all GPU objects exist. Render thread only.
    bool IsConstructed() const;

    /// Sets vertices, tile mode, blend state and program. The caller then sets all uniforms, the projection
    /// first, and calls DrawVertices. Render thread only.
    Shader& Begin(void const* vertices, int count, IMKBitmapReadable* tiled, MKPaint const& paint);
    /// Draws the vertices that Begin set.
    void DrawVertices();
    /// The vertices, for drawables that draw several times with the same uniforms.
    IGraphicsObject& GetGraphics();

    /// The bitmap to draw, or null.
    RefPtr<IMKBitmap> mBitmap;
    RefPtr<IMKBitmap> mSecondBitmap; ///< for drawables that have two

private:
    struct Objects;

    void ConstructRT();

    IGLMsgQueue* mQueue;
    PrimitiveType mPrimitive;
    VertexDescriptor mVertex;
    std::unique_ptr<Objects> mObjects; // used on the render thread only
};

} // namespace Moka::detail

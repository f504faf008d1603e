/// CustomDrawable: the base of the library's custom drawables. It creates and releases the GPU objects on the
/// render thread, while the drawable itself lives on any thread, and holds the bitmaps to draw.
/// Owner:  reference counted; the creator holds the first reference, the task that creates the GPU objects
///         one more. If a queue refuses that task, the drawable draws nothing and is never deleted; if it
///         refuses a release, that object leaks.
/// Thread: construction, destruction and setters on the caller's thread, DrawRT on the render thread. Setters
///         are not synchronised. They also affect draws that are posted but not yet run.
/// Fails:  silently: without GPU objects, or without a bitmap that can be sampled, DrawRT touches nothing.
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
    /// Takes or drops a reference; the last Unref deletes the drawable.
    int Ref() override { return RefCount::Ref(); }
    int Unref() override { return RefCount::Unref(); }

protected:
    /// Posts the creation of the GPU objects. Without a queue there are none.
    CustomDrawable(IGLMsgQueue* queue, PrimitiveType primitive, VertexDescriptor const& vertex);

    /// Does nothing when it is the bitmap already held; otherwise takes a reference of its own. Null is none.
    static void Hold(RefPtr<IMKBitmap>& held, IMKBitmap* bitmap) {
        if (held.Get() != bitmap) held = RefPtr<IMKBitmap>::Share(bitmap);
    }
    /// Null when there is none that can be sampled.
    static IMKBitmapReadable* GetReadable(RefPtr<IMKBitmap> const& bitmap);

    /// Whether all GPU objects could be created.
    bool IsConstructed() const;

    /// Everything that comes before the uniforms. The caller sets all of them, the projection first, then
    /// ends with DrawVertices.
    Shader& Begin(void const* vertices, int count, IMKBitmapReadable* tiled, MKPaint const& paint);
    /// Draws the vertices that Begin set.
    void DrawVertices();
    /// For drawables that draw several times with the same uniforms.
    IGraphicsObject& GetGraphics();

    /// The bitmaps drawn; null without.
    RefPtr<IMKBitmap> mBitmap;
    RefPtr<IMKBitmap> mSecondBitmap; ///< of those that have two

private:
    struct Objects;

    void ConstructRT();

    IGLMsgQueue* mQueue;
    PrimitiveType mPrimitive;
    VertexDescriptor mVertex;
    std::unique_ptr<Objects> mObjects; // of the render thread
};

} // namespace Moka::detail

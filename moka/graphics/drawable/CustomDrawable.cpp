#include "moka/graphics/drawable/CustomDrawable.h"

#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/drawable/DrawState.h"
#include "moka/graphics/drawable/Drawing.h"
#include "moka/graphics/drawable/MKGraphicsUtil.h"
#include "moka/graphics/drawable/ShaderPtr.h"
#include "moka/graphics/drawable/Shaders.h"

#include <new>
#include <utility>

namespace Moka::detail {

template <class Shader>
struct CustomDrawable<Shader>::Objects {
    Objects(PrimitiveType primitive, VertexDescriptor const& vertex)
        : graphics(CreateGraphics(primitive, vertex)), shader(GetShader<Shader>()) {}

    void PostRelease(IGLMsgQueue* queue) {
        detail::PostRelease(queue, std::move(graphics));
        state.PostRelease(queue);
        if (!shader) return;
        WorkerTask::PostMember(queue, ShaderManager::GetInstance(), &ShaderManager::ReleaseShader<Shader>,
                               shader.release());
    }

    RendererPtr<IGraphicsObject> graphics;
    DrawState state;
    ShaderPtr<Shader> shader;
};

template <class Shader>
CustomDrawable<Shader>::CustomDrawable(IGLMsgQueue* queue, PrimitiveType primitive,
                                       VertexDescriptor const& vertex)
    : mQueue(queue), mPrimitive(primitive), mVertex(vertex) {
    if (!queue) return;
    RefCount::Ref();
    WorkerTask::PostMember(queue, this, &CustomDrawable::ConstructRT);
}

// Calls no virtual function, because it may run before the constructors of derived classes have finished.
template <class Shader>
void CustomDrawable<Shader>::ConstructRT() {
    RefPtr<RefCount> const self = RefPtr<RefCount>::Adopt(this);
    mObjects.reset(new (std::nothrow) Objects(mPrimitive, mVertex));
}

template <class Shader>
CustomDrawable<Shader>::~CustomDrawable() {
    if (mObjects) mObjects->PostRelease(mQueue);
}

template <class Shader>
IMKBitmapReadable* CustomDrawable<Shader>::GetReadable(RefPtr<IMKBitmap> const& bitmap) {
    return bitmap ? bitmap->GetBitmapReadable() : nullptr;
}

template <class Shader>
bool CustomDrawable<Shader>::IsConstructed() const {
    return mObjects && mObjects->graphics && mObjects->state && mObjects->shader;
}

template <class Shader>
Shader& CustomDrawable<Shader>::Begin(void const* vertices, int count, IMKBitmapReadable* tiled,
                                      MKPaint const& paint) {
    mObjects->graphics->SetVertices(0, vertices, count);
    mObjects->state.ApplyBlend(paint.GetXFermode());
    if (tiled) MKGraphicsUtil::SetTileModeRT(tiled, paint);
    mObjects->state.ApplyDepthStencil();
    mObjects->shader->program->MakeCurrent();
    return *mObjects->shader;
}

template <class Shader>
void CustomDrawable<Shader>::DrawVertices() {
    DrawAll(*mObjects->graphics);
}

template <class Shader>
IGraphicsObject& CustomDrawable<Shader>::GetGraphics() {
    return *mObjects->graphics;
}

template class CustomDrawable<MKBlenderBitmapsShader>;
template class CustomDrawable<MKGaussianBlurShader>;
template class CustomDrawable<MKNonPremultipliedColorShader>;
template class CustomDrawable<MKStrokeShader>;
template class CustomDrawable<MKTextMaskBitmapShader>;

} // namespace Moka::detail

#include "moka/graphics/drawable/MKBitmapDrawable.h"

#include "moka/graphics/bitmap/BitmapCreation.h"
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/drawable/Drawing.h"
#include "moka/graphics/drawable/FringeGeometry.h"
#include "moka/graphics/drawable/MKGraphicsUtil.h"
#include "moka/graphics/drawable/ProjectedBounds.h"
#include "moka/renderer/ITextureObject.h"

#include <algorithm>
#include <climits>
#include <memory>
#include <new>

namespace Moka {

using namespace detail;

namespace {

constexpr char const* kCopyTag = "MKBitmapDrawable::DrawBitmapRT mDstBitmapForAdvancedBlending";
constexpr char const* kBatchCopyTag = "MKBitmapDrawable::DrawBitmapRT mDstBitmapForAdvancedBlending 1";

// On this GPU colours may exceed alpha.
constexpr char const* kClampGpu = "Mali-T830";

bool IsDarkenOrLighten(MKPaint const& paint) {
    return paint.GetXFermode() == MKPaint::Darken || paint.GetXFermode() == MKPaint::Lighten;
}

// Compat: right-edge
RectF TextureCoordinates(RectF const& bounds, RectF const& src) {
    float const width = bounds.GetWidth();
    float const height = bounds.GetHeight();
    return {(src.left - bounds.left) / width, (src.top - bounds.top) / height,
            (src.right + bounds.left) / width, (src.bottom - bounds.top) / height};
}

TexturedVertex* WriteTextured(TexturedVertex* at, RectF const& dst, RectF const& uv, bool antiAliased) {
    return WriteFill(at, dst, antiAliased,
                     [&](Outline const& outline) { return TexturedCorners(outline, uv); });
}

// Converts to int. Returns 0, which the factory rejects, if the value is not a valid size.
int ToSize(float value) {
    return value >= 1.0f && value < static_cast<float>(INT_MAX) ? static_cast<int>(value) : 0;
}

bool HasSizeOf(IMKBitmap const& bitmap, RectF const& bounds) {
    return static_cast<float>(bitmap.GetWidth()) == bounds.GetWidth() &&
           static_cast<float>(bitmap.GetHeight()) == bounds.GetHeight();
}

} // namespace

MKBitmapDrawable::MKBitmapDrawable(IGLMsgQueue* queue)
    : mQueue(queue), mGraphics(CreateGraphics(PrimitiveType::TriangleList, FloatVertex({3, 2}))) {
    if (RendererFactory::IsGPUNameEqualTo(kClampGpu))
        mClampShader = GetShader<MKBitmapShaderColorClamp>();
    else
        mPlainShader = GetShader<MKBitmapShader>();
    mAdvancedShader = GetShader<MKBitmapAdvancedBlendingShader>();
}

MKBitmapDrawable::~MKBitmapDrawable() {
    mGraphics.reset();
    mState.Release();
    mPlainShader.reset();
    mClampShader.reset();
    mAdvancedShader.reset();
    mDestination = {};
}

bool MKBitmapDrawable::IsReady() const {
    return mGraphics && mState && (mPlainShader || mClampShader) && mAdvancedShader;
}

bool MKBitmapDrawable::DrawBitmapRT(IMKBitmapReadable* bitmap, RectF const& bitmapBounds,
                                    RectF const& targetBounds, RectF const& src, RectF const& dst,
                                    Matrix4<float> const& projection, MKPaint const& paint) {
    if (!bitmap || !IsReady()) return false;
    TexturedVertex vertices[kMostFillVertices];
    TexturedVertex const* const end =
        WriteTextured(vertices, dst, TextureCoordinates(bitmapBounds, src), paint.IsAntiAliasing());
    mGraphics->SetVertices(0, vertices, static_cast<int>(end - vertices));
    mGraphics->SetBounds(Project(Hull(dst, 0.5f), projection));
    return DrawVertices(bitmap, targetBounds, kCopyTag, projection, paint);
}

bool MKBitmapDrawable::DrawBitmapsRT(IMKBitmapReadable* bitmap, RectF const& bitmapBounds,
                                     RectF const& targetBounds, RectF const& src,
                                     std::vector<RectF> const* dsts, Matrix4<float> const& projection,
                                     MKPaint const& paint) {
    if (!bitmap || !dsts || !IsReady()) return false;
    if (dsts->size() > static_cast<std::size_t>(INT_MAX / kMostFillVertices)) return false;
    bool const antiAliased = paint.IsAntiAliasing();
    std::size_t const count = dsts->size() * (antiAliased ? kMostFillVertices : kQuadVertices);
    std::unique_ptr<TexturedVertex[]> vertices(new (std::nothrow) TexturedVertex[count]);
    if (!vertices) return false;
    RectF const uv = TextureCoordinates(bitmapBounds, src);
    TexturedVertex* end = vertices.get();
    RectF hull = dsts->empty() ? RectF() : Hull(dsts->front(), 0.5f);
    for (RectF const& dst : *dsts) {
        end = WriteTextured(end, dst, uv, antiAliased);
        RectF const box = Hull(dst, 0.5f);
        hull = {std::min(hull.left, box.left), std::min(hull.top, box.top), std::max(hull.right, box.right),
                std::max(hull.bottom, box.bottom)};
    }
    mGraphics->SetVertices(0, vertices.get(), static_cast<int>(count));
    mGraphics->SetBounds(Project(hull, projection));
    vertices.reset();
    return DrawVertices(bitmap, targetBounds, kBatchCopyTag, projection, paint);
}

bool MKBitmapDrawable::DrawVertices(IMKBitmapReadable* bitmap, RectF const& targetBounds, char const* copyTag,
                                    Matrix4<float> const& projection, MKPaint const& paint) {
    mState.ApplyBlend(paint.GetXFermode());
    MKGraphicsUtil::SetTileModeRT(bitmap, paint);
    if (IsDarkenOrLighten(paint)) return DarkenOrLighten(bitmap, targetBounds, copyTag, projection, paint);
    auto const draw = [&](auto& shader) {
        UseShader(shader, projection, paint);
        bitmap->ActivateTextureRT(0, false);
        shader.uSrcTexture = 0;
        return DrawAll(*mGraphics);
    };
    return mClampShader ? draw(*mClampShader) : draw(*mPlainShader);
}

bool MKBitmapDrawable::DarkenOrLighten(IMKBitmapReadable* bitmap, RectF const& targetBounds,
                                       char const* copyTag, Matrix4<float> const& projection,
                                       MKPaint const& paint) {
    if (!CopyDestination(targetBounds, copyTag)) return false;
    MKBitmapAdvancedBlendingShader& shader = *mAdvancedShader;
    shader.program->MakeCurrent();
    shader.uProjectionMatrix = projection;
    shader.uColor = paint.GetColor();
    shader.uTintColor = paint.GetTintColor();
    shader.uDstTextureSize = Vector2<float>(targetBounds.GetWidth(), targetBounds.GetHeight());
    shader.uHasTintColor = paint.HasTintColor() ? 1 : 0;
    shader.uBlendingMode = paint.GetXFermode() == MKPaint::Darken ? 1 : 2;
    bitmap->ActivateTextureRT(0, false);
    shader.uSrcTexture = 0;
    mDestination->GetBitmapReadable()->ActivateTextureRT(1, false);
    shader.uDstTexture = 1;
    return DrawAll(*mGraphics);
}

bool MKBitmapDrawable::CopyDestination(RectF const& targetBounds, char const* tag) {
    if (!mDestination || !HasSizeOf(*mDestination, targetBounds)) {
        mDestination = {};
        mDestination = RefPtr<IMKBitmap>::Adopt(CreateTextureBitmap(mQueue, ToSize(targetBounds.GetWidth()),
                                                                    ToSize(targetBounds.GetHeight()), nullptr,
                                                                    false, 0, false));
        if (!mDestination) return false;
        mDestination->SetTag(tag);
    }
    IMKSubBitmap* const strip = mDestination->GetTextureBitmap()->GetSubBitmap(0);
    ITextureObject* const texture = strip ? strip->GetTexture() : nullptr;
    if (!texture) return false;
    texture->CopyFromRenderTarget();
    return true;
}

} // namespace Moka

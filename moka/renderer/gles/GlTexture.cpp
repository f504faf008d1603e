#include "moka/renderer/gles/GlTexture.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlFrameBuffer.h"
#include "moka/renderer/gles/GlRenderTarget.h"
#include "moka/renderer/gles/GlTables.h"
#include "moka/renderer/gles/GlTextureStorage.h"

#include <utility>

namespace Moka::detail {
namespace {

GLenum& FieldOf(GlSampling& sampling, GLenum parameter) {
    switch (parameter) {
    case GL_TEXTURE_MIN_FILTER:
        return sampling.minFilter;
    case GL_TEXTURE_MAG_FILTER:
        return sampling.magFilter;
    case GL_TEXTURE_WRAP_S:
        return sampling.wrapS;
    default:
        return sampling.wrapT;
    }
}

} // namespace

GlTexture::GlTexture(std::shared_ptr<GlTextureStorage> storage) : mStorage(std::move(storage)) {
    ++GetContext().statistics.textureObjects;
}

GlTexture::~GlTexture() { GetContext().DropTextureObject(); }

GlContext& GlTexture::GetContext() const { return *mStorage->GetContext(); }

void GlTexture::SetLabel(char const* text) {
    mLabel = text ? text : "";
    GlOperation const operation(GetContext());
    if (operation) GetContext().debug.Label(GL_TEXTURE, mStorage->GetName(), mLabel.c_str());
}

void GlTexture::Bind(int unit) {
    GlContext& context = GetContext();
    GlOperation const operation(context);
    if (!operation) return;
    int const count = context.state.GetSamplingUnitCount();
    if (unit < 0 || unit >= count) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "a texture (\"%s\") cannot be bound to unit %d; units are 0 to %d", GetLabel(),
                            unit, count - 1);
        return;
    }
    if (mSampler == 0) mSampler = context.samplers.Get(mSampling);
    context.current.SetTexture(unit, mStorage, mSampler);
    if (context.IsThrough()) context.state.BindTexture(unit, mStorage->GetName(), mSampler);
}

void GlTexture::Replace(void const* pixels, int stride) {
    Replace(Rect(0, 0, GetWidth(), GetHeight()), pixels, stride);
}

void GlTexture::Replace(Rect const& rect, void const* pixels, int stride) {
    GlOperation const operation(GetContext());
    if (!operation || !pixels) return;
    std::int64_t const tight = (std::int64_t{rect.right} - rect.left) * kBytesPerPixel;
    if (stride > 0 && stride < tight) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "pixels for a texture (\"%s\") are refused: rows of %d bytes lie %d bytes apart; "
                            "the stride is in bytes, 0 for tightly packed rows",
                            GetLabel(), static_cast<int>(tight), stride);
        return;
    }
    GetContext().PlayIfUsed(*mStorage);
    mStorage->Upload(rect, pixels, stride > 0 ? stride : tight);
}

void GlTexture::DrawToCurrent() {
    GlContext& context = GetContext();
    GlOperation const operation(context);
    if (!operation || IsActiveTarget()) return;
    context.Play();
    mStorage->CopyTo(context.targets.GetCurrent());
}

void GlTexture::SetParameter(int id, int value) {
    GLenum const parameter = ToGlParameter(id);
    GLenum const glValue = ToGlParameterValue(id, value);
    if (parameter == GL_NONE || glValue == GL_NONE) {
        __android_log_print(
            ANDROID_LOG_ERROR, "mok_log",
            "texture parameter %d = %d is refused (\"%s\"); wrapping is 0 and 1 with value 0, "
            "1 or 3, filtering 4 and 5 with value 0 or 1",
            id, value, GetLabel());
        return;
    }
    GLenum& field = FieldOf(mSampling, parameter);
    if (field == glValue) return;
    field = glValue;
    mSampler = 0;
}

void GlTexture::CopyFromRenderTarget() {
    GlContext& context = GetContext();
    GlOperation const operation(context);
    if (!operation || IsActiveTarget()) return;
    GlTargetUse target{nullptr, GetWidth(), GetHeight(), 0};
    if (GlRenderTarget const* const active = context.targets.GetActive()) {
        target = active->GetUse();
    } else {
        target.frameBuffer = GlFrameBuffer::OfHost(context.targets.GetHosts());
    }
    context.list.Add(GlTargetCopy{std::move(target), mStorage});
    context.AfterAdding();
}

bool GlTexture::IsActiveTarget() const {
    GlRenderTarget const* const active = GetContext().targets.GetActive();
    return active && active->GetStorage() == mStorage.get();
}

int GlTexture::GetWidth() const { return mStorage->GetWidth(); }

int GlTexture::GetHeight() const { return mStorage->GetHeight(); }

} // namespace Moka::detail

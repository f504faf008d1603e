#include "moka/renderer/record/TextureObject.h"

#include "moka/base/Trace.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/record/Observer.h"
#include "moka/renderer/record/Recorder.h"
#include "moka/renderer/record/RenderTarget.h"
#include "moka/renderer/record/TextureStorage.h"

#include <algorithm>
#include <new>
#include <utility>

namespace Moka::detail {
namespace {

constexpr ObjectKind kTextureKind = ObjectKind::kTexture;

bool IsWrap(int value) {
    return value == TextureWrapRepeat || value == TextureWrapClampToEdge ||
           value == TextureWrapMirroredRepeat;
}

bool IsFilter(int value) { return value >= TextureFilterNearest && value <= TextureFilterMipmapped; }

// Returns false for an unknown parameter or value.
bool StoreParameter(Sampling& sampling, int id, int value) {
    switch (id) {
    case TextureParamWrappingS:
    case TextureParamWrappingT: {
        if (!IsWrap(value)) return false;
        auto const wrap = static_cast<TextureParamWrappingValue>(value);
        (id == TextureParamWrappingS ? sampling.wrapS : sampling.wrapT) = wrap;
        return true;
    }
    case TextureParamFilteringMin:
    case TextureParamFilteringMag: {
        if (!IsFilter(value)) return false;
        auto const filter = static_cast<TextureParamFilteringValue>(value);
        if (id == TextureParamFilteringMin) {
            sampling.minFilter = filter;
        } else { // GL uses mipmap levels for minification only
            sampling.magFilter = filter == TextureFilterMipmapped ? TextureFilterLinear : filter;
        }
        return true;
    }
    default:
        return false;
    }
}

} // namespace

TextureObject::TextureObject(std::shared_ptr<TextureStorage> storage) : mStorage(std::move(storage)) {
    ++mStorage->GetRecorder()->counters.textureObjects;
}

TextureObject::~TextureObject() {
    Observe(kTextureKind, static_cast<ITextureObject*>(this), "Release");
    mStorage->GetRecorder()->DropTextureObject();
}

void TextureObject::SetLabel(char const* text) {
    Observe(kTextureKind, static_cast<ITextureObject*>(this), "SetLabel", text ? text : "");
    try {
        mLabel = text ? text : "";
    } catch (std::bad_alloc const&) {
        return; // the former label stays
    }
    Recorder& recorder = *mStorage->GetRecorder();
    if (recorder.Begin()) recorder.GetDevice().LabelTexture(mStorage->GetName(), mLabel.c_str());
}

void TextureObject::Bind(int unit) {
    Observe(kTextureKind, static_cast<ITextureObject*>(this), "Bind", unit);
    Recorder& recorder = *mStorage->GetRecorder();
    if (!recorder.Begin()) return;
    int const count = recorder.requested->GetUnitCount();
    if (unit < 0 || unit >= count) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "a texture (\"%s\") cannot be bound to unit %d; units are 0 to %d", GetLabel(),
                            unit, count - 1);
        return;
    }
    recorder.requested->SetTexture(unit, mStorage, mSampling);
    TextureRef const texture{mStorage->GetName(), mSampling, unit};
    // External GL may sample it before the next draw of ours.
    if (recorder.FlushesAtOnce() && recorder.UpdateMipmaps(texture)) recorder.Flush();
    recorder.CommitAtOnce([&](StateCommit& commit) {
        commit.textures = &texture;
        commit.textureCount = 1;
    });
}

void TextureObject::Replace(void const* pixels, int stride) {
    Observe(kTextureKind, static_cast<ITextureObject*>(this), "Replace", pixels ? "pixels" : "null", stride);
    Upload(Rect(0, 0, GetWidth(), GetHeight()), pixels, stride);
}

void TextureObject::Replace(Rect const& rect, void const* pixels, int stride) {
    Observe(kTextureKind, static_cast<ITextureObject*>(this), "Replace", rect.left, rect.top, rect.right,
            rect.bottom, pixels ? "pixels" : "null", stride);
    Upload(rect, pixels, stride);
}

void TextureObject::Upload(Rect const& rect, void const* pixels, int stride) {
    Recorder& recorder = *mStorage->GetRecorder();
    RequestScope const scope(recorder);
    if (!scope || !pixels) return;
    std::int64_t const tight = (std::int64_t{rect.right} - rect.left) * kBytesPerPixel;
    if (stride > 0 && stride < tight) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "pixels for a texture (\"%s\") are refused: rows of %d bytes lie %d bytes apart; "
                            "the stride is in bytes, 0 for tightly packed rows",
                            GetLabel(), static_cast<int>(tight), stride);
        return;
    }
    PixelBlock const block = PixelBlock::Clip(rect.left, rect.top, std::int64_t{rect.right} - rect.left,
                                              std::int64_t{rect.bottom} - rect.top, GetWidth(), GetHeight());
    if (block.IsEmpty()) return;
    TraceScope const trace("renderer", "Upload", "bytes", block.GetBytes());
    recorder.FlushIfUsed(mStorage->GetName());
    recorder.GetDevice().Upload(mStorage->GetName(), block, pixels, stride > 0 ? stride : tight);
    recorder.mipmaps.Forget(mStorage->GetName());
    recorder.counters.bytesUploaded += block.GetBytes();
}

void TextureObject::DrawToCurrent() {
    Observe(kTextureKind, static_cast<ITextureObject*>(this), "DrawToCurrent");
    Recorder& recorder = *mStorage->GetRecorder();
    RequestScope const scope(recorder);
    if (!scope || IsActiveTarget()) return;
    DeviceName const frameBuffer = mStorage->TakeFrameBuffer();
    if (frameBuffer == 0) return;
    TargetRef const to = recorder.GetCurrentTarget();
    recorder.mipmaps.Forget(to.texture);
    recorder.Add(TextureDraw{mStorage->Describe(frameBuffer), to});
    mStorage->ReturnFrameBuffer(frameBuffer);
}

void TextureObject::SetParameter(int id, int value) {
    Observe(kTextureKind, static_cast<ITextureObject*>(this), "SetParameter", id, value);
    Store(id, value);
}

void TextureObject::Store(int id, int value) {
    if (StoreParameter(mSampling, id, value)) return;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "texture parameter %d = %d is refused (\"%s\"); wrapping is 0 and 1 with value 0, "
                        "1 or 3, filtering 4 and 5 with value 0, 1 or 2",
                        id, value, GetLabel());
}

void TextureObject::CopyFromRenderTarget() {
    Observe(kTextureKind, static_cast<ITextureObject*>(this), "CopyFromRenderTarget");
    Recorder& recorder = *mStorage->GetRecorder();
    RequestScope const scope(recorder);
    if (!scope || IsActiveTarget()) return;
    TargetRef const from = recorder.GetCurrentTarget();
    // Only a frame buffer of the host may lack alpha. The device then copies by way of a frame buffer.
    DeviceName const own = from.texture == 0 ? mStorage->TakeFrameBuffer() : 0;
    int const width = from.width > 0 ? std::min(from.width, GetWidth()) : GetWidth();
    int const height = from.height > 0 ? std::min(from.height, GetHeight()) : GetHeight();
    recorder.mipmaps.Forget(mStorage->GetName());
    recorder.Add(TargetCopy{from, mStorage->Describe(own), width, height});
    if (own != 0) mStorage->ReturnFrameBuffer(own);
}

bool TextureObject::IsActiveTarget() const {
    RenderTarget const* const active = mStorage->GetRecorder()->GetActive();
    return active && active->GetRef().texture == mStorage->GetName();
}

int TextureObject::GetParameter(int id) const {
    switch (id) {
    case TextureParamWrappingS:
        return mSampling.wrapS;
    case TextureParamWrappingT:
        return mSampling.wrapT;
    case TextureParamFilteringMin:
        return mSampling.minFilter;
    case TextureParamFilteringMag:
        return mSampling.magFilter;
    default:
        return -1;
    }
}

int TextureObject::GetWidth() const { return mStorage->GetWidth(); }

int TextureObject::GetHeight() const { return mStorage->GetHeight(); }

} // namespace Moka::detail

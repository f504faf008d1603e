// RecordingObjects.h: the renderer's objects as the recording renderer makes them.
#pragma once

#include "moka/renderer/IDepthStencilBuffer.h"
#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IShaderProgram.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/TextureDescriptor.h"
#include "moka/renderer/TextureParameter.h"
#include "tests/support/RecordingDevice.h"

#include <array>
#include <cstddef>
#include <new>

namespace Moka::Testing::detail {

// The part of a texture that the library deletes. Deleting it returns no memory: a released twin takes its
// place there, so that a second deletion or a use finds somebody who complains.
class RecordingTexture final : public ITextureObject {
public:
    explicit RecordingTexture(TextureState& state) : mState(state) {}
    ~RecordingTexture() override;
    static void operator delete(void* memory);

    void SetLabel(char const* text) override;
    char const* GetLabel() const override;
    void Bind(int unit) override;
    void Replace(void const* pixels, int stride) override;
    void Replace(Rect const& rect, void const* pixels, int stride) override;
    void DrawToCurrent() override;
    void SetParameter(int id, int value) override;
    void CopyFromRenderTarget() override;
    int GetWidth() const override;
    int GetHeight() const override;

    TextureState& GetState() const { return mState; }

private:
    TextureState& mState;
};

struct TextureState final : ObjectState {
    static constexpr ObjectKind kKind = ObjectKind::Texture;

    TextureState(int textureNumber, int textureContext, std::shared_ptr<Surface> image);
    ~TextureState() override;

    // False, with a log line, for what names no parameter or no value of it.
    bool SetParameter(int id, int value);
    // Copies a block of pixels whose first one lies at (x, y), as far as it is inside the texture; stride in
    // bytes. Returns the bytes copied.
    std::size_t Upload(Rect const& rect, void const* pixels, std::size_t stride);

    ITextureObject* GetObject() { return std::launder(reinterpret_cast<RecordingTexture*>(memory)); }

    std::shared_ptr<Surface> surface;
    std::string label;
    std::map<int, int> parameters;
    alignas(RecordingTexture) std::byte memory[sizeof(RecordingTexture)];
};

class RecordingBuffer final : public ObjectState, public IDepthStencilBuffer {
public:
    static constexpr ObjectKind kKind = ObjectKind::DepthStencilBuffer;

    RecordingBuffer(int number_, int context_, int w, int h)
        : ObjectState(kKind, number_, context_), width(w), height(h) {}

    void Release() override;

    int const width;
    int const height;
};

class RecordingTarget final : public ObjectState, public IRenderTarget {
public:
    static constexpr ObjectKind kKind = ObjectKind::RenderTarget;

    RecordingTarget(int number_, int context_, std::shared_ptr<Surface> surface, int w, int h, bool offscreen)
        : ObjectState(kKind, number_, context_),
          mSurface(std::move(surface)),
          mWidth(w),
          mHeight(h),
          mOffscreen(offscreen) {}

    void Activate() override;
    void Deactivate(bool discardColor, bool discardDepthStencil) override;
    void ReadPixels(int x, int y, int width, int height, PixelDestination const& destination) override;
    void Release() override;
    void ClearColor(float r, float g, float b, float a) override;
    void AttachDepthStencil(IDepthStencilBuffer* buffer) override;
    void DetachDepthStencil() override;
    void ClearDepthStencil(bool clearDepth, float depth, bool clearStencil, int stencil) override;

    bool IsOffscreen() const { return mOffscreen; }
    Surface* GetSurface() const { return mSurface.get(); }
    std::shared_ptr<Surface> const& ShareSurface() const { return mSurface; }
    RecordingBuffer* GetAttached() const { return mAttached; }
    void Forget(RecordingBuffer const* buffer) {
        if (mAttached == buffer) mAttached = nullptr;
    }

private:
    // The part of a block that this target has; one made from the current frame buffer can claim more.
    Rect Clip(ScissorRect const& rect) const;
    // The target's part of what is written down about a clear of it.
    RecordedClear DescribeClear(PipelineState const& state) const;

    std::shared_ptr<Surface> mSurface;
    int mWidth;
    int mHeight;
    bool mOffscreen;
    RecordingBuffer* mAttached = nullptr;
};

// The value of a uniform, by its type.
struct UniformValue {
    static UniformValue Read(BindingType type, void const* value);

    std::vector<float> GetNumbers() const;

    BindingType type = BindingTypeUnknown;
    std::array<float, 16> floats{}; // of the types made of floats
    int integer = 0;                // of the others

    friend bool operator==(UniformValue const& a, UniformValue const& b) {
        return a.type == b.type && a.floats == b.floats && a.integer == b.integer;
    }
};
std::ostream& operator<<(std::ostream& text, UniformValue const& value);

// Knows its uniforms from the declarations in the sources; none of them is ever removed.
class RecordingProgram final : public ObjectState, public IShaderProgram {
public:
    static constexpr ObjectKind kKind = ObjectKind::Program;

    RecordingProgram(int number_, int context_, char const* vertexSource, char const* fragmentSource,
                     char const* label);

    void MakeCurrent() override;
    void Release() override;
    IParameterBinding* GetParameter(char const* name) override;

    std::string const& GetLabel() const { return mLabel; }
    // Its handles may outlive it.
    bool MustStay() const override { return !released || liveParameters > 0; }

    int liveParameters = 0;
    std::map<std::string, UniformValue> values; // those that were set, by the uniform's name

private:
    std::string const mLabel;
    std::map<std::string, BindingType> mTypes;
};

} // namespace Moka::Testing::detail

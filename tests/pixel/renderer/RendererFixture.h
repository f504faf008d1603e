// RendererFixture: the renderer over a real driver, one fresh context a test, and what every test must leave
// behind: no object of any kind, no GL error, no log line that it did not expect.
#pragma once

#include "moka/host/EglContext.h"
#include "moka/renderer/IDepthStencilBuffer.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IShaderProgram.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "scenes/Picture.h"

#include <GLES3/gl3.h>
#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace Moka::Testing {

using Scenes::Color;
using Scenes::Picture;

constexpr Color kClear{};
constexpr Color kRed{255, 0, 0, 255};
constexpr Color kGreen{0, 255, 0, 255};
constexpr Color kBlue{0, 0, 255, 255};
constexpr Color kUntouched{0xEE, 0xDD, 0xCC, 0xBB};

// A driver that counts names upwards gives deleted ones away again once this one is taken. A host may take any.
constexpr GLuint kLastName = 0xFFFFFFFE;

Picture MakeImage(int width, int height, Color const& fill = kUntouched);
// Every pixel different from every other.
Picture MakePattern(int width, int height);
// Components from 0 to 1.
std::array<float, 4> ToFloats(Color const& color);

struct Releaser {
    template <class T>
    void operator()(T* object) const {
        object->Release();
    }
};
using TexturePtr = std::unique_ptr<ITextureObject>;
using TargetPtr = std::unique_ptr<IRenderTarget, Releaser>;
using ProgramPtr = std::unique_ptr<IShaderProgram, Releaser>;
using DepthStencilPtr = std::unique_ptr<IDepthStencilBuffer, Releaser>;

struct OffscreenImage {
    TexturePtr texture;
    TargetPtr target;
};

// A frame buffer as a host makes it, with raw GL, bound when made.
class HostFrameBuffer {
public:
    HostFrameBuffer(int width, int height, GLenum format = GL_RGBA8, Color const& fill = kUntouched);
    ~HostFrameBuffer();
    HostFrameBuffer(HostFrameBuffer const&) = delete;
    HostFrameBuffer& operator=(HostFrameBuffer const&) = delete;

    GLuint GetName() const { return mName; }
    Picture Read() const;

private:
    int const mWidth;
    int const mHeight;
    GLuint mName = 0;
    GLuint mColor = 0;
};

class RendererFixture : public ::testing::Test {
protected:
    RendererFixture();
    // Looks at what is left, when the members of the fixtures that derive from it are gone.
    ~RendererFixture() override;

    static bool Attach(RendererLimits const& limits = {});

    static TexturePtr MakeTexture(int width, int height, PixelSource const& source = {});
    static TexturePtr MakeTexture(Picture const& image);
    static TargetPtr MakeTarget(ITextureObject& texture);
    static OffscreenImage MakeOffscreen(Picture const& image);
    static DepthStencilPtr MakeDepthStencil(int width, int height);

    static Picture Read(IRenderTarget& target, int width, int height);
    static Picture Read(ITextureObject& texture);
    static void Clear(IRenderTarget& target, Color color);

    // The error lines since the last call; one that nobody takes fails the test.
    std::vector<std::string> TakeErrors();
    static RendererStatistics Count() { return RendererFactory::GetStatistics(); }
    // For tests that make the driver complain on purpose.
    void ForgetDriverErrors();

    // The default frame buffer.
    static constexpr int kSurfaceWidth = 64;
    static constexpr int kSurfaceHeight = 48;
    // Ends the context, if there is one, and begins another one.
    void StartEgl();

private:
    std::unique_ptr<detail::EglContext> mEgl;
    std::vector<std::string> mErrors;
    std::uint64_t mKnownDriverErrors = 0;
};

GLint GetInteger(GLenum name);

// For tests with deferral and without.
inline std::string GetDrawMode(::testing::TestParamInfo<bool> const& mode) {
    return mode.param ? "Deferred" : "Immediate";
}

} // namespace Moka::Testing

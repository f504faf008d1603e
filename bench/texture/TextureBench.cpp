// Measures uploads and read-backs of the renderer and of bare GL alternately, so that other load on the
// machine affects both. The main counter is "ratio": the renderer's time divided by bare GL's, the median of
// all pairs. Each transfer ends with glFinish, because drivers defer uploads.
#include "moka/base/Rect.h"
#include "moka/host/EglContext.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"

#include <GLES3/gl3.h>
#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <vector>

namespace Moka {
namespace {

constexpr int kSide = 2048;
constexpr int kStrips = 4;
constexpr std::size_t kPixels = std::size_t{kSide} * kSide;

std::vector<std::uint32_t>& GetPixels() {
    static std::vector<std::uint32_t> pixels(kPixels, 0x80604020u);
    return pixels;
}

std::uint32_t* RowOf(int y) { return GetPixels().data() + static_cast<std::ptrdiff_t>(y) * kSide; }

// Attaches the context once for all benchmarks. It lives until the process ends.
void AttachOnce() {
    static std::unique_ptr<detail::EglContext> const egl = [] {
        std::string error;
        std::unique_ptr<detail::EglContext> context = detail::EglContext::Open({}, &error);
        if (!context || !RendererFactory::AttachContext()) {
            std::fprintf(stderr, "%s\n", error.c_str());
            std::exit(1);
        }
        // The mode that a host with a queue uses.
        RendererFactory::SetDeferred(true);
        return context;
    }();
}

std::unique_ptr<ITextureObject> MakeTexture(int width, int height, PixelSource const& source = {}) {
    TextureDescriptor const descriptor(width, height, 0, 2, 6, 1, false, nullptr);
    return std::unique_ptr<ITextureObject>(
        RendererFactory::CreateTextureObject(descriptor, nullptr, 0, source));
}

GLuint MakeBareTexture(int width, int height) {
    GLuint name = 0;
    glGenTextures(1, &name);
    glBindTexture(GL_TEXTURE_2D, name);
    glTexStorage2D(GL_TEXTURE_2D, 1, GL_RGBA8, width, height);
    return name;
}

template <class Function>
double Time(Function const& function) {
    auto const start = std::chrono::steady_clock::now();
    function();
    glFinish();
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

template <class Function>
double TimeForeign(Function const& function) {
    RendererFactory::Flush();
    double const seconds = Time(function);
    RendererFactory::InvalidateState();
    return seconds;
}

double Median(std::vector<double>& values) {
    std::nth_element(values.begin(), values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2),
                     values.end());
    return values[values.size() / 2];
}

template <class Ours, class Bare>
void Compare(benchmark::State& state, std::int64_t bytes, Ours const& ours, Bare const& bare) {
    std::vector<double> bareTimes;
    std::vector<double> ratios;
    bool oursFirst = false;
    for (auto _ : state) {
        oursFirst = !oursFirst;
        double bareTime = oursFirst ? 0 : TimeForeign(bare);
        double const oursTime = Time(ours);
        if (oursFirst) bareTime = TimeForeign(bare);
        bareTimes.push_back(bareTime);
        ratios.push_back(oursTime / bareTime);
        state.SetIterationTime(oursTime);
    }
    state.counters["bare_us"] = Median(bareTimes) * 1e6;
    state.counters["ratio"] = Median(ratios);
    state.SetBytesProcessed(state.iterations() * bytes);
}

constexpr std::int64_t BytesOf(int width, int height) { return std::int64_t{4} * width * height; }

// Uploads a whole texture, or a block of half its width from a larger image.
void Upload(benchmark::State& state) {
    AttachOnce();
    int const width = static_cast<int>(state.range(0));
    std::unique_ptr<ITextureObject> const texture = MakeTexture(kSide, kSide);
    GLuint const bareTexture = MakeBareTexture(kSide, kSide);
    Compare(
        state, BytesOf(width, kSide),
        [&] { texture->Replace(Rect(0, 0, width, kSide), GetPixels().data(), kSide * 4); },
        [&] {
            glBindTexture(GL_TEXTURE_2D, bareTexture);
            glPixelStorei(GL_UNPACK_ROW_LENGTH, kSide);
            glTexSubImage2D(GL_TEXTURE_2D, 0, 0, 0, width, kSide, GL_RGBA, GL_UNSIGNED_BYTE,
                            GetPixels().data());
            glPixelStorei(GL_UNPACK_ROW_LENGTH, 0);
        });
    glDeleteTextures(1, &bareTexture);
}
BENCHMARK(Upload)->Arg(kSide)->Arg(kSide / 2)->UseManualTime()->Unit(benchmark::kMicrosecond);

// Uploads a tall image as strips, including the creation of the textures.
void UploadStrips(benchmark::State& state) {
    AttachOnce();
    constexpr int kHeight = kSide / kStrips;
    Compare(
        state, BytesOf(kSide, kSide),
        [&] {
            std::unique_ptr<ITextureObject> strips[kStrips];
            for (int i = 0; i < kStrips; ++i) {
                strips[i] = MakeTexture(kSide, kHeight, {GetPixels().data(), 0, i * kHeight, kSide});
            }
        },
        [&] {
            GLuint strips[kStrips];
            for (int i = 0; i < kStrips; ++i) {
                strips[i] = MakeBareTexture(kSide, kHeight);
                glTexSubImage2D(GL_TEXTURE_2D, 0, 0, 0, kSide, kHeight, GL_RGBA, GL_UNSIGNED_BYTE,
                                RowOf(i * kHeight));
            }
            glDeleteTextures(kStrips, strips);
        });
}
BENCHMARK(UploadStrips)->UseManualTime()->Unit(benchmark::kMicrosecond);

// Bare GL reads from a frame buffer that is already bound; the renderer binds its own. Reading a single pixel
// shows the cost of that.
void ReadBack(benchmark::State& state) {
    AttachOnce();
    int const side = static_cast<int>(state.range(0));
    std::unique_ptr<ITextureObject> const texture =
        MakeTexture(kSide, kSide, {GetPixels().data(), 0, 0, kSide});
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture.get());
    RendererFactory::Flush();
    GLuint const bareTexture = MakeBareTexture(kSide, kSide);
    glTexSubImage2D(GL_TEXTURE_2D, 0, 0, 0, kSide, kSide, GL_RGBA, GL_UNSIGNED_BYTE, GetPixels().data());
    GLuint bareFrameBuffer = 0;
    glGenFramebuffers(1, &bareFrameBuffer);
    glBindFramebuffer(GL_FRAMEBUFFER, bareFrameBuffer);
    glFramebufferTexture2D(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, bareTexture, 0);
    RendererFactory::InvalidateState();
    std::vector<std::uint32_t> destination(kPixels);
    Compare(
        state, BytesOf(side, side),
        [&] {
            target->ReadPixels(0, 0, side, side, {destination.data(), kSide, 0, 0});
        },
        [&] {
            glBindFramebuffer(GL_FRAMEBUFFER, bareFrameBuffer);
            glPixelStorei(GL_PACK_ROW_LENGTH, kSide);
            glReadPixels(0, 0, side, side, GL_RGBA, GL_UNSIGNED_BYTE, destination.data());
            glPixelStorei(GL_PACK_ROW_LENGTH, 0);
        });
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    glDeleteFramebuffers(1, &bareFrameBuffer);
    glDeleteTextures(1, &bareTexture);
    RendererFactory::InvalidateState();
    target->Release();
}
BENCHMARK(ReadBack)->Arg(kSide)->Arg(kSide / 2)->Arg(1)->UseManualTime()->Unit(benchmark::kMicrosecond);

} // namespace
} // namespace Moka

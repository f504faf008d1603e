// NullDevice: a device without a driver. Images live in memory: uploads, read-backs, copies and clears are real.
// Draws are counted and draw nothing. For tests of a caller's logic, CPU cost without a driver, and threads.
// Thread: render thread.
#pragma once

#include "moka/renderer/device/Device.h"

#include <unordered_map>
#include <vector>

namespace Moka::detail {

// RGBA8, rows packed.
struct NullImage {
    int width = 0;
    int height = 0;
    std::vector<unsigned char> pixels;

    void Resize(int w, int h);
    unsigned char* At(int x, int y);
    // What x, y, width, height has inside the image gets the colour.
    void Fill(ScissorRect const& rect, std::array<float, 4> const& color);
};

class NullDevice : public Device {
public:
    explicit NullDevice(Counters& counters) : mCounters(counters) {}

    DeviceCaps GetCaps() const override;
    DeviceName CreateTexture(int width, int height) override;
    void DeleteTexture(DeviceName texture) override;
    void Upload(DeviceName texture, PixelBlock const& block, void const* pixels,
                std::int64_t stride) override;
    void ReadPixels(TargetRef const& target, PixelBlock const& block, void* pixels, int rowLength) override;
    DeviceName CreateFrameBuffer(DeviceName texture, int width, int height) override;
    void DeleteFrameBuffer(DeviceName frameBuffer) override;
    DeviceName CreateDepthStencil(int width, int height) override;
    void DeleteDepthStencil(DeviceName depthStencil) override;
    // Reports the uniforms that the sources declare.
    DeviceName CreateProgram(char const* vertexSource, char const* fragmentSource, char const* label,
                             ProgramLayout* layout) override;
    void DeleteProgram(DeviceName program) override;
    int AddVertexFormat(VertexDescriptor const& descriptor) override;
    void Submit(DrawList const& list) override;
    void Commit(StateCommit const& commit) override;
    void RestoreHost(HostState) override {}
    void InvalidateState() override {}
    DeviceName GetHostFrameBuffer() override { return 0; }
    bool QueryScissorTest() override { return mScissor.on; }
    ScissorRect QueryScissorRect() override { return mScissor.rect; }
    void LabelTexture(DeviceName, char const*) override {}
    void DeleteSamplers() override {}

protected:
    // The texture's image, or the one host frame buffer that there is, which grows with its targets.
    NullImage& GetImage(TargetRef const& target);
    virtual void Execute(Discard const& discard);
    virtual void Execute(TextureClear const& clear);

private:
    void Execute(Run const& run);
    void Execute(ColorClear const& clear);
    void Execute(DepthStencilClear const& clear);
    void Execute(TargetCopy const& copy);
    void Execute(TextureDraw const& draw);
    void Execute(MipmapUpdate const& update);
    void Copy(TargetRef const& from, TargetRef const& to, int width, int height);

    Counters& mCounters;
    DeviceName mLastName = 0; // of any kind
    std::unordered_map<DeviceName, NullImage> mTextures;
    NullImage mHost;
    ScissorState mScissor; // as committed, which is all that a query can find
    std::vector<VertexDescriptor> mFormats;
};

} // namespace Moka::detail

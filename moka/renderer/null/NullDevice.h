// NullDevice: a device without a driver. Images are in memory, and uploads, read-backs, copies and clears
// work. Draws are counted and draw nothing. Use it to test a caller's logic and threads, and to measure CPU
// cost without a driver.
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
    // Fills the part of rect that lies inside the image.
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
    // Returns the texture's image, or the image of the host's only frame buffer, which grows to the size of
    // its targets.
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
    ScissorState mScissor; // the last committed state, for queries
    std::vector<VertexDescriptor> mFormats;
};

} // namespace Moka::detail

// Device: the recorder's interface to a GPU. It creates objects by name, transfers pixels and submits draw
// lists. The device of a program is chosen at link time: each device defines MakeDevice.
// Owner:  the recorder, from attaching a context to detaching it.
// Thread: render thread.
// Units:  pixels; texture row 0 is row 0 of a frame buffer with the texture. RGBA8, premultiplied alpha.
// Fails:  creation returns 0 and logs an error with the driver's text. Functions throw nothing but bad_alloc.
// The recorder validates all arguments: sizes are positive and within the limit, blocks are clipped, names
// exist.
#pragma once

#include "moka/renderer/RendererFactory.h"
#include "moka/renderer/VertexDescriptor.h"
#include "moka/renderer/device/Counters.h"
#include "moka/renderer/device/DrawList.h"
#include "moka/renderer/device/PixelBlock.h"
#include "moka/renderer/device/ProgramLayout.h"

#include <memory>
#include <string>

namespace Moka::detail {

struct DeviceCaps {
    int maxTextureSize = 0;
    int samplingUnits = 0; // texture units that draws may use
    std::string vendor;
    std::string renderer;
    std::string version;
};

// The state to set for external GL. A null pointer leaves that state unchanged.
struct StateCommit {
    TargetRef const* target = nullptr;
    bool const* scissorTest = nullptr;
    ScissorRect const* scissorRect = nullptr;
    BlendStateDescriptor const* blend = nullptr;
    DepthStencilStateDescriptor const* depthStencil = nullptr;
    DeviceName program = 0;
    unsigned char const* values = nullptr; // of the program
    TextureRef const* textures = nullptr;
    std::size_t textureCount = 0;
};

enum class HostState {
    FrameBuffers,
    VertexInput,
    All, // both, the viewport, culling, depth test and dithering; also unbinds our samplers
};

class Device {
public:
    // Deletes the device's own objects: samplers, vertex arrays, buffers.
    virtual ~Device() = default;

    virtual DeviceCaps GetCaps() const = 0;

    // The texture has undefined contents and one level. Its own parameters, which external GL uses, are
    // linear filters and clamp to edge.
    virtual DeviceName CreateTexture(int width, int height) = 0;
    virtual void DeleteTexture(DeviceName texture) = 0;
    // pixels points to the first pixel of the requested block. stride is the distance of its rows in bytes
    // and may be any number.
    virtual void Upload(DeviceName texture, PixelBlock const& block, void const* pixels,
                        std::int64_t stride) = 0;
    // pixels points to the first pixel of the requested block. rowLength is the distance of its rows in
    // pixels.
    virtual void ReadPixels(TargetRef const& target, PixelBlock const& block, void* pixels,
                            int rowLength) = 0;

    // Creates a frame buffer with the texture as its colour attachment, without depth and stencil.
    virtual DeviceName CreateFrameBuffer(DeviceName texture, int width, int height) = 0;
    virtual void DeleteFrameBuffer(DeviceName frameBuffer) = 0;
    // 24 bits of depth and 8 of stencil, undefined contents. TargetRef::depthStencil attaches it.
    virtual DeviceName CreateDepthStencil(int width, int height) = 0;
    virtual void DeleteDepthStencil(DeviceName depthStencil) = 0;

    // Attributes get their locations in the order of their declaration. If the sources do not compile,
    // returns a program that draws nothing. Returns 0 only if the driver cannot create any program.
    virtual DeviceName CreateProgram(char const* vertexSource, char const* fragmentSource, char const* label,
                                     ProgramLayout* layout) = 0;
    virtual void DeleteProgram(DeviceName program) = 0;

    // Returns the index of a vertex layout; equal layouts have the same one.
    virtual int AddVertexFormat(VertexDescriptor const& descriptor) = 0;

    // Executes the commands in order.
    virtual void Submit(DrawList const& list) = 0;

    // Sets GL state for external GL that draws next.
    virtual void Commit(StateCommit const& commit) = 0;
    // Restores the state of the host that Submit, Commit and the transfers changed.
    virtual void RestoreHost(HostState what) = 0;
    // Call this when external GL may have changed any state.
    virtual void InvalidateState() = 0;

    // The frame buffer that the host has bound for drawing, or had before the renderer bound another one.
    virtual DeviceName GetHostFrameBuffer() = 0;
    virtual bool QueryScissorTest() = 0;
    virtual ScissorRect QueryScissorRect() = 0;

    // Sets the name that GL debuggers show. The text is copied.
    virtual void LabelTexture(DeviceName texture, char const* text) = 0;
    // Call this when no texture object exists any more, so that no sampler is in use.
    virtual void DeleteSamplers() = 0;
};

// If the current context cannot be used, logs an error and returns null. The counters must outlive the
// device.
std::unique_ptr<Device> MakeDevice(RendererProcLoader loader, Counters& counters);

} // namespace Moka::detail

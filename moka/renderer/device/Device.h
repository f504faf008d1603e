// Device: the interface of the recorder to a GPU: objects by name, transfers of pixels, and the submission of
// draw lists. Which device a program has is decided when linking: each device defines MakeDevice.
// Owner:  the recorder, from attaching a context to detaching it.
// Thread: render thread.
// Units:  pixels; texture row 0 is row 0 of the frame buffer over it. RGBA8, premultiplied alpha.
// Fails:  creation gives 0 and logs one error line with the driver's text. Nothing throws except bad_alloc.
// The recorder validates arguments: sizes are positive and within the limit, blocks are clipped, names exist.
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

// State for external GL to find. Null pointers leave that part as it is.
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
    All, // both, the viewport, culling, depth test and dither; and no sampler stays bound
};

class Device {
public:
    // Deletes the device's own objects: samplers, vertex arrays, buffers.
    virtual ~Device() = default;

    virtual DeviceCaps GetCaps() const = 0;

    // Undefined contents, one level, linear filters and clamp to edge for external GL that samples it.
    virtual DeviceName CreateTexture(int width, int height) = 0;
    virtual void DeleteTexture(DeviceName texture) = 0;
    // pixels addresses the requested block's first pixel; stride is the distance of its rows, any number of
    // bytes.
    virtual void Upload(DeviceName texture, PixelBlock const& block, void const* pixels,
                        std::int64_t stride) = 0;
    // pixels addresses the requested block's first pixel; rowLength is the distance of its rows in pixels.
    virtual void ReadPixels(TargetRef const& target, PixelBlock const& block, void* pixels,
                            int rowLength) = 0;

    // Over the texture's storage, without depth and stencil.
    virtual DeviceName CreateFrameBuffer(DeviceName texture, int width, int height) = 0;
    virtual void DeleteFrameBuffer(DeviceName frameBuffer) = 0;
    // 24 bits of depth and 8 of stencil, undefined contents. TargetRef::depthStencil attaches it.
    virtual DeviceName CreateDepthStencil(int width, int height) = 0;
    virtual void DeleteDepthStencil(DeviceName depthStencil) = 0;

    // Attributes take locations in the order of their declaration. Sources that do not compile give a program
    // that draws nothing; 0 only when the driver makes no program at all.
    virtual DeviceName CreateProgram(char const* vertexSource, char const* fragmentSource, char const* label,
                                     ProgramLayout* layout) = 0;
    virtual void DeleteProgram(DeviceName program) = 0;

    // The number of a vertex layout; equal layouts have the same number.
    virtual int AddVertexFormat(VertexDescriptor const& descriptor) = 0;

    // Executes the commands in order.
    virtual void Submit(DrawList const& list) = 0;

    // Sets GL state for external GL that draws next.
    virtual void Commit(StateCommit const& commit) = 0;
    // Restores the state of the host that Submit, Commit and the transfers changed.
    virtual void RestoreHost(HostState what) = 0;
    // External GL may have changed any state.
    virtual void InvalidateState() = 0;

    // The frame buffer that the host has bound for drawing, now or beneath ours.
    virtual DeviceName GetHostFrameBuffer() = 0;
    virtual bool QueryScissorTest() = 0;
    virtual ScissorRect QueryScissorRect() = 0;

    // Shows in GL debuggers; the text is copied.
    virtual void LabelTexture(DeviceName texture, char const* text) = 0;
    // No texture object exists any more, so no sampling state is in use.
    virtual void DeleteSamplers() = 0;
};

// Null, with one error line, when the current context cannot be used. The counters outlive the device.
std::unique_ptr<Device> MakeDevice(RendererProcLoader loader, Counters& counters);

} // namespace Moka::detail

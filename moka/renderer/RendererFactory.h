/// RendererFactory: creates all GPU objects. The implementation is chosen when linking; see README.md here.
/// Thread: render thread, except where a line says otherwise. Debug builds check it.
/// Fails:  null or false, and logs an error with the driver's text; never an exception.
#pragma once

#include "moka/base/Export.h"
#include "moka/renderer/BlendStateDescriptor.h"
#include "moka/renderer/DepthStencilStateDescriptor.h"
#include "moka/renderer/IGraphicsObject.h"
#include "moka/renderer/PixelBuffer.h"
#include "moka/renderer/RendererStatistics.h"
#include "moka/renderer/TextureDescriptor.h"
#include "moka/renderer/TextureParameter.h"
#include "moka/renderer/VertexDescriptor.h"

namespace Moka {

class IBlendStateObject;
class IDepthStencilBuffer;
class IDepthStencilState;
class IRasterizerState;
class IRendererDeviceCaps;
class IRenderTarget;
class IShaderProgram;
class ITextureObject;

/// Lowers the device's limits, so that tests see tall images cut with small ones.
struct RendererLimits {
    int maxTextureSize = 0;  ///< texels; 0 keeps the device's own
    bool mergesDraws = true; ///< false: only draws of equal state and values become one draw call
};

/// The size of a render target.
struct RenderTargetSize {
    /// In pixels.
    int width = 0;
    int height = 0;
};

/// How the context's owner looks up entry points by name (eglGetProcAddress has this type).
using RendererProcLoader = void (*(*)(char const* name))();

class MOKA_API RendererFactory {
public:
    /// Called by the owner of the context, on the render thread with the context current, once before
    /// anything else and once after everything. Attach reads the device's capabilities and resets the
    /// statistics; false (and an error in the log) when the context is not OpenGL ES 3.0 or another one is
    /// attached. Without a loader there are no driver messages and no object labels. Detach deletes pooled
    /// and orphaned GL names; objects that are still alive become inert and may be released later; a program
    /// works again in the next context.
    static bool AttachContext(RendererLimits const& limits = {}, RendererProcLoader loader = nullptr);
    static void DetachContext();

    /// Any thread. Never null.
    static IRendererDeviceCaps const* GetRendererDeviceCaps();
    /// Any thread: whether the driver's renderer string is exactly name.
    static bool IsGPUNameEqualTo(char const* name);

    /// The texture starts with source's pixels (transparent without), explicit linear filters, clamp to edge,
    /// and then the parameters in order. Null when the descriptor is empty or too large for the device.
    static ITextureObject* CreateTextureObject(TextureDescriptor const& descriptor,
                                               TextureParameter const* parameters, int parameterCount,
                                               PixelSource const& source);

    /// The texture outlives the target's use; its storage is kept alive by the target.
    static IRenderTarget* CreateOffscreenRenderTarget(ITextureObject* texture);

    /// The frame buffer the host gives as the default one, or the one bound right now; captured at this
    /// moment.
    static IRenderTarget* CreateRenderTargetFromDefault(int width, int height);
    static IRenderTarget* CreateRenderTargetFromCurrent(int width, int height);

    /// Of the active target: its viewport is all of it. 0 x 0 without one.
    static RenderTargetSize GetActiveTargetSize();

    /// A depth-stencil buffer of this size in pixels; null when the driver has no memory.
    static IDepthStencilBuffer* CreateDepthStencilBuffer(int width, int height);

    /// GLSL ES 1.00 or 3.00. Attributes take locations 0, 1, ... in the order of their declaration. Never
    /// null: if sources do not compile, an error is logged and the program draws nothing.
    /// The name appears in messages and GL debuggers; all texts are copied.
    static IShaderProgram* CreateShaderProgram(char const* vertexSource, char const* fragmentSource,
                                               char const* name);

    /// Vertices of one stream, not indexed, drawn one instance at a time: streams is 1, indices and
    /// instanceStreams are 0; anything else, and a descriptor without attributes, is refused.
    static IGraphicsObject* CreateGraphicsObject(int streams, PrimitiveType primitive,
                                                 VertexDescriptor const* descriptor, int indices,
                                                 int instanceStreams);

    /// A state object that starts with the descriptor.
    static IBlendStateObject* CreateBlendStateObject(BlendStateDescriptor const& descriptor);
    static IDepthStencilState* CreateDepthStencilState(DepthStencilStateDescriptor const& descriptor);

    /// Never null; not to be released.
    static IRasterizerState* GetRasterizerState();

    /// While on, the current stencil test is a clip, which draws cannot switch off: applying a state without
    /// a stencil test keeps it, and clearing the colour fills through it.
    static void SetStencilClip(bool on);

    /// Off until switched on. Immediate: all requests between an activation and its deactivation reach GL at
    /// the deactivation, and the host gets its frame buffer back there. Deferred: they reach GL when somebody
    /// could see the difference, at the latest in Flush(). A host that calls Flush() whenever its queue runs
    /// empty switches it on.
    static void SetDeferred(bool on);

    /// Before external GL: submits all requests so far. The host's frame buffers, viewport,
    /// vertex array, culling, depth test and dither are as they were, pixel store holds GL's defaults, no
    /// sampler is bound. The vertex and uniform buffers that the host had bound are bound again. Scissor,
    /// blend, stencil and masks are as last set or applied here. Not restored: texture bindings, the program,
    /// and uniform buffer binding point 23, which a host should not use. An active target stays the active
    /// one.
    static void Flush();
    /// Before external GL that draws into the active target: submits all requests so far. Then the
    /// target is bound, and viewport, scissor, blend, stencil, masks, program and textures are as last set or
    /// applied here. Until InvalidateState() every operation reaches GL at once.
    static void Commit();
    /// After external GL: drops the cached GL state.
    static void InvalidateState();

    /// Any thread: a snapshot.
    static RendererStatistics GetStatistics();
};

} // namespace Moka

/// RendererFactory: creates all GPU objects. The implementation is chosen at link time; see README.md in this
/// folder.
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

/// Lowers the device's limits, so that tests get bitmaps of several strips from small images.
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

/// A function that returns GL entry points by name. eglGetProcAddress has this type.
using RendererProcLoader = void (*(*)(char const* name))();

class MOKA_API RendererFactory {
public:
    /// The owner of the context calls this before all other functions, on the thread that becomes the render
    /// thread, with the context current. Reads the device's capabilities and resets the statistics. Logs an
    /// error and returns false if the context is not OpenGL ES 3.0 or later, or if another one is attached.
    /// Without a loader there are no driver messages and no object labels.
    static bool AttachContext(RendererLimits const& limits = {}, RendererProcLoader loader = nullptr);
    /// The owner of the context calls this last, with the context current. Submits all requests and deletes
    /// pooled GL objects. Objects that still exist become inert and may be released later. A program works
    /// again in the next context.
    static void DetachContext();

    /// The capabilities of the device. Any thread. Never null.
    static IRendererDeviceCaps const* GetRendererDeviceCaps();
    /// True if the driver's GL_RENDERER string equals name exactly. Any thread.
    static bool IsGPUNameEqualTo(char const* name);

    /// Creates a texture with the pixels of source, or a transparent one if source has none. The sampling
    /// state is linear and clamp to edge, then the parameters are set in order. Returns null if the size is
    /// empty or too large for the device. If the descriptor has a model, the texture is another view of the
    /// model's storage.
    static ITextureObject* CreateTextureObject(TextureDescriptor const& descriptor,
                                               TextureParameter const* parameters, int parameterCount,
                                               PixelSource const& source);

    /// Creates a target that draws into the texture. The target keeps the texture's storage alive, not the
    /// object.
    static IRenderTarget* CreateOffscreenRenderTarget(ITextureObject* texture);

    /// Creates a target for the frame buffer that the host has bound now. Size in pixels.
    static IRenderTarget* CreateRenderTargetFromDefault(int width, int height);
    /// Creates a target for the frame buffer of the active target, or else for the one that the host has
    /// bound now.
    static IRenderTarget* CreateRenderTargetFromCurrent(int width, int height);

    /// The size of the active target, which is also the viewport. 0 x 0 if no target is active.
    static RenderTargetSize GetActiveTargetSize();

    /// Creates a depth-stencil buffer of this size in pixels. Returns null if the driver is out of memory.
    static IDepthStencilBuffer* CreateDepthStencilBuffer(int width, int height);

    /// Compiles and links GLSL ES 1.00 or 3.00. Attributes get locations 0, 1, ... in the order of their
    /// declaration. Never null: if the sources do not compile, logs an error, and the program draws nothing.
    /// The name appears in messages and GL debuggers. All texts are copied.
    static IShaderProgram* CreateShaderProgram(char const* vertexSource, char const* fragmentSource,
                                               char const* name);

    /// Creates an object for vertices of this layout. streams must be 1, indices and instanceStreams 0, and
    /// the descriptor must have attributes. Otherwise logs an error and returns null.
    static IGraphicsObject* CreateGraphicsObject(int streams, PrimitiveType primitive,
                                                 VertexDescriptor const* descriptor, int indices,
                                                 int instanceStreams);

    /// Create a state object with this descriptor. It takes effect with Apply().
    static IBlendStateObject* CreateBlendStateObject(BlendStateDescriptor const& descriptor);
    static IDepthStencilState* CreateDepthStencilState(DepthStencilStateDescriptor const& descriptor);

    /// The renderer's scissor state. Never null; do not release it.
    static IRasterizerState* GetRasterizerState();

    /// While on, the current stencil test is a clip: applying a state without a stencil test does not switch
    /// it off, and clearing the colour affects only pixels that pass it.
    static void SetStencilClip(bool on);

    /// Switches between immediate mode (the default) and deferred mode. In immediate mode, all requests
    /// between an activation and its deactivation reach GL at the deactivation, which also binds the host's
    /// frame buffer again. In deferred mode, requests reach GL when their result is needed, at the latest in
    /// Flush(). Use it only if the host calls Flush() whenever its queue is empty.
    static void SetDeferred(bool on);

    /// Submits all requests so far. Call it before external GL.
    /// It restores the host's frame buffers, viewport, vertex array, vertex and uniform buffer bindings,
    /// culling, depth test and dithering. It sets the pixel store to GL's defaults and unbinds all samplers.
    /// Scissor, blend, stencil and masks stay as last set or applied here. Texture bindings, the program, and
    /// uniform buffer binding point 23, which a host should not use, are not restored. An active target stays
    /// active.
    static void Flush();
    /// Submits all requests so far, then binds the active target and sets viewport, scissor, blend, stencil,
    /// masks, program and textures as last set or applied here. Call it before external GL that draws into
    /// the active target. Until InvalidateState() every request reaches GL at once.
    static void Commit();
    /// Drops the cached GL state. Call it after external GL.
    static void InvalidateState();

    /// A snapshot of the counts. Any thread.
    static RendererStatistics GetStatistics();
};

} // namespace Moka

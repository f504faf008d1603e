/// ITextureObject: an RGBA8 texture, or one of several views of the same storage.
/// Owner:  the creator, who deletes it. Shared storage lives until its last view is deleted.
/// Thread: render thread. Any thread may delete the object; the render thread then deletes the GL texture.
/// Units:  texels; row 0 is the first row uploaded and is sampled at v = 0. Premultiplied alpha.
#pragma once

#include "moka/base/Rect.h"

namespace Moka {

class ITextureObject {
public:
    virtual ~ITextureObject() = default;

    /// The label is copied at once and shows in GL debuggers. Null is the empty label.
    virtual void SetLabel(char const* text) = 0;
    virtual char const* GetLabel() const = 0;

    /// Binds the texture, with its own sampling state, to a texture unit.
    virtual void Bind(int unit) = 0;

    /// Replaces all texels; stride in bytes, 0 or less for tightly packed rows. Null pixels do nothing; a
    /// stride shorter than a row is refused with a log line.
    virtual void Replace(void const* pixels, int stride) = 0;

    /// Replaces the texels of rect; pixels addresses rect's first pixel. Source
    /// pixels outside the texture are skipped; the others keep their places.
    virtual void Replace(Rect const& rect, void const* pixels, int stride) = 0;

    /// Copies its texels to the current frame buffer, at GL's origin. Ignores blend, scissor, stencil and
    /// masks.
    virtual void DrawToCurrent() = 0;

    /// Sets the value of a TextureParamWrapping or TextureParamFiltering id, for this view only. Unknown ids
    /// and values log an error and change nothing.
    virtual void SetParameter(int id, int value) = 0;

    /// Copies the active render target into this texture, without a flip: the first rows and columns, up to
    /// the smaller of both sizes. A target without alpha counts as opaque. If the target draws into this
    /// texture, nothing happens.
    virtual void CopyFromRenderTarget() = 0;

    /// The size in texels.
    virtual int GetWidth() const = 0;
    virtual int GetHeight() const = 0;

    /// The value of a parameter for this view; -1 for an unknown id.
    virtual int GetParameter(int id) const = 0;
};

} // namespace Moka

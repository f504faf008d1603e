/// ITextureObject: an RGBA8 texture, or one of several views of the same storage.
/// Owner:  the creator; deleting it is the release. Storage that is shared lives until the last view
///         goes.
/// Thread: render thread. Deleting elsewhere is tolerated: the GL name is dropped when the render thread next
///         runs.
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

    /// Makes the texture, with its own sampling state, current on a texture unit.
    virtual void Bind(int unit) = 0;

    /// Replaces all texels; stride in bytes, 0 or less for tightly packed rows. Null pixels do nothing; a
    /// stride shorter than a row is refused with a log line.
    virtual void Replace(void const* pixels, int stride) = 0;

    /// Replaces the texels of rect; pixels addresses rect's first pixel. Source
    /// pixels outside the texture are skipped; the others keep their places.
    virtual void Replace(Rect const& rect, void const* pixels, int stride) = 0;

    /// Copies itself texel for texel into the current frame buffer's lower left corner, whatever blend,
    /// scissor, stencil or mask are set to.
    virtual void DrawToCurrent() = 0;

    /// A TextureParamWrapping or TextureParamFiltering id and its value, for this view alone; an unknown one
    /// is refused with a log line.
    virtual void SetParameter(int id, int value) = 0;

    /// Takes a copy of the bound render target: the smaller of both sizes, from its first row, without a
    /// flip. A target without alpha reads as opaque; one over this texture's own storage changes nothing.
    virtual void CopyFromRenderTarget() = 0;

    /// The size in texels.
    virtual int GetWidth() const = 0;
    virtual int GetHeight() const = 0;

    /// Its value for this view; -1 for an unknown one.
    virtual int GetParameter(int id) const = 0;
};

} // namespace Moka

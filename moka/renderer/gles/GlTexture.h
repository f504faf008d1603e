// GlTexture: a texture object: a view of a storage with its own sampling state and label.
#pragma once

#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/gles/GlSamplers.h"

#include <memory>
#include <string>

namespace Moka::detail {

class GlContext;
class GlTextureStorage;

class GlTexture final : public ITextureObject {
public:
    explicit GlTexture(std::shared_ptr<GlTextureStorage> storage);
    ~GlTexture() override;

    std::shared_ptr<GlTextureStorage> const& GetStorage() const { return mStorage; }

    void SetLabel(char const* text) override;
    char const* GetLabel() const override { return mLabel.c_str(); }
    void Bind(int unit) override;
    void Replace(void const* pixels, int stride) override;
    void Replace(Rect const& rect, void const* pixels, int stride) override;
    void DrawToCurrent() override;
    void SetParameter(int id, int value) override;
    void CopyFromRenderTarget() override;
    int GetWidth() const override;
    int GetHeight() const override;

private:
    GlContext& GetContext() const;
    // A copy of an image onto itself changes nothing, and asking GL for it is undefined.
    bool IsActiveTarget() const;

    std::shared_ptr<GlTextureStorage> const mStorage;
    GlSampling mSampling;
    GLuint mSampler = 0; // 0 until bound with the present sampling state
    std::string mLabel;
};

} // namespace Moka::detail

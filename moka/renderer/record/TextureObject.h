// TextureObject: a texture as the library sees it: shared texels, with its own sampling state and label.
#pragma once

#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/device/RunState.h"

#include <memory>
#include <string>

namespace Moka::detail {

class TextureStorage;

class TextureObject final : public ITextureObject {
public:
    explicit TextureObject(std::shared_ptr<TextureStorage> storage);
    ~TextureObject() override;

    std::shared_ptr<TextureStorage> const& GetStorage() const { return mStorage; }
    Sampling const& GetSampling() const { return mSampling; }
    // Sets an initial parameter when the texture is created.
    void Store(int id, int value);

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
    int GetParameter(int id) const override;

private:
    void Upload(Rect const& rect, void const* pixels, int stride);
    // True if the copy's source is the same texture. The copy is then skipped, because GL leaves it
    // undefined.
    bool IsActiveTarget() const;

    std::shared_ptr<TextureStorage> const mStorage;
    Sampling mSampling;
    std::string mLabel;
};

} // namespace Moka::detail

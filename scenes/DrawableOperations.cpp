#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "scenes/SceneError.h"
#include "scenes/SceneSteps.h"

#include <new>

namespace Moka::Scenes {
namespace {

// Returns an operation that draws the result of make(bitmaps). Each draw creates a new drawable.
template <class Make>
SceneOperation DrawMade(MKPaint const& paint, Make const& make) {
    return {[=](IMKCanvas& canvas, SceneBitmaps const& bitmaps) {
                auto const drawable = RefPtr<IMKCustomDrawable>::Adopt(make(bitmaps));
                if (!drawable) throw SceneError("there is no room for the scene's drawables");
                canvas.Draw(drawable.Get(), &paint);
            },
            1, true};
}

SceneOperation ReadBlendedBitmap(SceneFields& fields, SceneNames const& names) {
    std::size_t const first = GetBitmap(fields, names, "first");
    std::size_t const second = GetBitmap(fields, names, "second");
    SceneValue const* const size = fields.Find("size");
    return DrawMade(
        GetPaint(fields, names), [=, src = fields.GetRect("src"), dst = fields.GetRect("dst"),
                                  by = size ? ReadPoint(*size) : PointF()](SceneBitmaps const& bitmaps) {
            // The drawable takes ownership of these references.
            return new (std::nothrow)
                MKBlendedBitmapDrawable(bitmaps.queue, RefPtr<IMKBitmap>(bitmaps[first]).Release(),
                                        RefPtr<IMKBitmap>(bitmaps[second]).Release(), src, dst, by.x, by.y);
        });
}

SceneOperation ReadGaussianBlur(SceneFields& fields, SceneNames const& names) {
    std::size_t const bitmap = GetBitmap(fields, names);
    SceneValue const* const horizontal = fields.Find("horizontal");
    SceneValue const* const amount = fields.Find("amount");
    SceneValue const* const offset = fields.Find("offset");
    return DrawMade(GetPaint(fields, names),
                    [=, isHorizontal = !horizontal || ReadBool(*horizontal),
                     by = amount ? ReadFloat(*amount) : 1.0f,
                     shift = offset ? ReadPoint(*offset) : PointF()](SceneBitmaps const& bitmaps) {
                        auto* const blur = new (std::nothrow) MKGaussianBlurDrawable(bitmaps.queue);
                        if (!blur) return blur;
                        blur->SetBitmap(bitmaps[bitmap].Get());
                        blur->SetHorizotalDirection(isHorizontal);
                        blur->SetBlurAmount(by);
                        blur->SetOffset(shift.x, shift.y);
                        return blur;
                    });
}

SceneOperation ReadNonPremultipliedColor(SceneFields& fields, SceneNames const& names) {
    std::size_t const src = GetBitmap(fields, names, "src");
    std::size_t const dst = GetBitmap(fields, names, "dst");
    return DrawMade(GetPaint(fields, names), [=](SceneBitmaps const& bitmaps) {
        auto* const drawable = new (std::nothrow) MKNonPremultipliedColorDrawable(bitmaps.queue);
        if (drawable) drawable->SetBitmap(bitmaps[src].Get(), bitmaps[dst].Get());
        return drawable;
    });
}

SceneOperation ReadTextMask(SceneFields& fields, SceneNames const& names) {
    std::size_t const bitmap = GetBitmap(fields, names);
    return DrawMade(GetPaint(fields, names),
                    [=, x = fields.GetFloat("x"), y = fields.GetFloat("y")](SceneBitmaps const& bitmaps) {
                        auto* const mask = new (std::nothrow) MKTextMaskBitmapDrawable(bitmaps.queue);
                        if (!mask) return mask;
                        mask->SetBitmap(bitmaps[bitmap].Get());
                        mask->SetDstPosition(x, y);
                        return mask;
                    });
}

SceneOperation ReadLeftOut(SceneFields& fields, SceneNames const&) {
    ReadText(fields.Get("what"));
    return {[](IMKCanvas&, SceneBitmaps const&) {}};
}

} // namespace

SceneOperationTable const& GetDrawableOperations() {
    static SceneOperationTable const kTable{
        {"DrawBlendedBitmap", ReadBlendedBitmap},
        {"DrawGaussianBlur", ReadGaussianBlur},
        {"DrawNonPremultipliedColor", ReadNonPremultipliedColor},
        {"DrawTextMask", ReadTextMask},
        {"LeftOut", ReadLeftOut},
    };
    return kTable;
}

} // namespace Moka::Scenes

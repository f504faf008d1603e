#include "scenes/RecordedDrawables.h"

#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"

namespace Moka::Scenes {

void DrawableLine::AddBitmap(SceneLine& line, char const* key, IMKBitmap* bitmap) {
    RecordedBitmaps::Result const recorded = mBitmaps.Record(bitmap);
    if (!recorded.reason.empty()) mReason = recorded.reason;
    mDrawsNothing = mDrawsNothing || (recorded.name.empty() && recorded.reason.empty());
    line.AddText(key, recorded.name);
}

// Writes the operations that DrawableOperations.cpp reads.
std::optional<SceneLine> DrawableLine::Describe(IMKCustomDrawable& drawable) {
    if (auto const* const blend = dynamic_cast<MKBlendedBitmapDrawable const*>(&drawable)) {
        SceneLine line("DrawBlendedBitmap");
        AddBitmap(line, "first", blend->GetBitmapFirst());
        AddBitmap(line, "second", blend->GetBitmapSecond());
        // After the read-back, because a draw on the render thread may set the size.
        line.Add("src", blend->GetSrc()).Add("dst", blend->GetDst());
        return line.Add("size", PointF(blend->GetWidth(), blend->GetHeight()));
    }
    if (auto const* const blur = dynamic_cast<MKGaussianBlurDrawable const*>(&drawable)) {
        SceneLine line("DrawGaussianBlur");
        AddBitmap(line, "bitmap", blur->GetBitmap());
        line.Add("horizontal", blur->IsHorizontal()).Add("amount", blur->GetBlurAmount());
        return line.Add("offset", blur->GetOffset());
    }
    if (auto const* const color = dynamic_cast<MKNonPremultipliedColorDrawable const*>(&drawable)) {
        SceneLine line("DrawNonPremultipliedColor");
        AddBitmap(line, "src", color->GetSrc());
        AddBitmap(line, "dst", color->GetDst());
        return line;
    }
    if (auto const* const mask = dynamic_cast<MKTextMaskBitmapDrawable const*>(&drawable)) {
        SceneLine line("DrawTextMask");
        AddBitmap(line, "bitmap", mask->GetBitmap());
        return line.Add("x", mask->GetDstPosition().x).Add("y", mask->GetDstPosition().y);
    }
    if (auto* const stroke = dynamic_cast<MKStrokeDrawable*>(&drawable)) {
        std::vector<std::array<float, 3>> points;
        for (MKStrokePoint const& p : stroke->ReadPoints()) points.push_back({p.x, p.y, p.width});
        return SceneLine("DrawStroke").Add("points", points);
    }
    return std::nullopt;
}

} // namespace Moka::Scenes

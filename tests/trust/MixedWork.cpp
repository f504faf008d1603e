#include "tests/trust/MixedWork.h"

#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/graphics/paint/MKPaint.h"

namespace Moka::Testing {
namespace {

constexpr int kBytes = MixedWork::kSide * MixedWork::kHeight * 4;
unsigned char const thePixels[kBytes] = {};

template <class Drawable>
RefPtr<Drawable> MakeDrawable(IGLMsgQueue& queue) {
    return RefPtr<Drawable>::Adopt(new Drawable(&queue));
}

} // namespace

int MixedWork::Pick(int n) { return static_cast<int>(mRandom() % static_cast<unsigned>(n)); }

template <class List>
auto& MixedWork::Any(List& list) {
    return list[static_cast<std::size_t>(Pick(static_cast<int>(list.size())))];
}

template <class List>
void MixedWork::DropOne(List& list) {
    list.erase(list.begin() + Pick(static_cast<int>(list.size())));
    ++mCalls;
}

void MixedWork::Step() {
    if (mBitmaps.size() < 3 || Pick(12) == 0) return AddBitmap();
    if (mCanvases.size() < 2 || Pick(20) == 0) return AddCanvas();
    if (mBitmaps.size() > 10) return DropOne(mBitmaps);
    if (mCanvases.size() > 5) return DropOne(mCanvases);
    switch (Pick(6)) {
    case 0:
        return UseBitmap(*Any(mBitmaps));
    case 1:
        return UseScreen();
    case 2:
        return UsePen();
    case 3:
        return UseDrawables(*Any(mCanvases));
    default:
        return Draw(*Any(mCanvases));
    }
}

void MixedWork::DropAll() {
    mCanvases.clear();
    mBitmaps.clear();
}

IMKBitmap* MixedWork::AnySource() { return mShared && Pick(3) == 0 ? mShared.Get() : Any(mBitmaps).Get(); }

void MixedWork::AddBitmap() {
    ++mCalls;
    if (Pick(2) == 0 && !mBitmaps.empty()) {
        mBitmaps.push_back(BitmapPtr::Adopt(AnySource()->Clone()));
        return;
    }
    auto* const pixels = Pick(2) == 0 ? new unsigned char[kBytes]() : nullptr;
    mBitmaps.push_back(
        BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&mQueue, kSide, kHeight, pixels, true, 1, false)));
}

void MixedWork::AddCanvas() {
    ++mCalls;
    mCanvases.push_back(
        RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&mQueue, Any(mBitmaps).Get(), 1)));
}

void MixedWork::UseBitmap(IMKBitmap& bitmap) {
    mCalls += 4;
    bitmap.SetTag("mixed");
    bitmap.GetTextureBitmap()->UpdateBitmap(thePixels, kSide * 4);
    bitmap.GetPixelAsync(Point(1, 1), nullptr, nullptr);
    if (IMKSubBitmap* const strip = bitmap.GetTextureBitmap()->GetSubBitmap(0))
        RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
}

void MixedWork::UseScreen() {
    mCalls += 4;
    auto const screen =
        BitmapPtr::Adopt(MKGraphicsFactory::CreateScreenBitmap(&mQueue, 0, 0, kSide, kSide, 1, 1));
    auto const canvas = RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&mQueue, screen.Get(), 1));
    canvas->DrawRect(0, 0, 5, 5, nullptr);
    screen->GetPixelAsync(Point(0, 0), nullptr, nullptr);
}

void MixedWork::UsePen() {
    mCalls += 3;
    auto const canvas =
        RefPtr<IMKPenCanvas>::Adopt(MKGraphicsFactory::CreatePenCanvas(&mQueue, Any(mBitmaps).Get(), 1));
    canvas->SetClipRect(0, 0, 3, 3, IMKCanvas::Intersect);
    canvas->Clear(0);
}

void MixedWork::UseDrawables(IMKCanvas& canvas) {
    mCalls += 6;
    IMKBitmap* const source = AnySource();
    auto const blur = MakeDrawable<MKGaussianBlurDrawable>(mQueue);
    blur->SetBitmap(source);
    canvas.Draw(blur.Get(), nullptr);
    auto const mask = MakeDrawable<MKTextMaskBitmapDrawable>(mQueue);
    mask->SetBitmap(source);
    canvas.Draw(mask.Get(), nullptr);
    // The drawable takes over these two references.
    source->Ref();
    source->Ref();
    RectF const whole(0, 0, kSide, kSide);
    auto const blend = RefPtr<MKBlendedBitmapDrawable>::Adopt(
        new MKBlendedBitmapDrawable(&mQueue, source, source, whole, whole, 0, 0));
    canvas.Draw(blend.Get(), nullptr);
}

void MixedWork::Draw(IMKCanvas& canvas) {
    mCalls += 11;
    MKPaint stroke;
    stroke.SetStyle(MKPaint::FillAndStroke);
    stroke.SetLineWidth(2);
    IMKBitmap* const source = AnySource();
    int const level = canvas.Save(IMKCanvas::SaveAll);
    if (Pick(4) == 0) canvas.PreRotate(30);
    canvas.SetClipRect(1, 1, 4, 9, Pick(2) == 0 ? IMKCanvas::Intersect : IMKCanvas::Xor);
    canvas.DrawRect(0, 0, 5, 11, &stroke);
    canvas.DrawRoundRect(0, 0, 5, 11, 2, 2, &stroke);
    canvas.DrawCircle(3, 3, 2, nullptr);
    canvas.DrawLine(0, 0, 5, 9, &stroke);
    canvas.DrawSimpleLines({{0, 0}, {5, 5}}, nullptr);
    canvas.DrawBitmap(source, 1, 1, nullptr);
    canvas.DrawBitmaps(source, {RectF(0, 0, 3, 3)}, nullptr);
    canvas.Restore(level);
    canvas.ClearAll(0);
}

} // namespace Moka::Testing

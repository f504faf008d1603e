// Operations.h: every operation that a checker hands on, once, with arguments that differ from one another.
#pragma once

#include "tests/unit/debug/CallLog.h"

#include <functional>

namespace Moka::Testing {

// A call, which gives what it returned as text.
template <class Interface>
class Operation {
public:
    template <class Call>
    Operation(Call call) : mCall([call](Interface& object) { return Run(call, object); }) {}

    std::string operator()(Interface& object) const { return mCall(object); }

private:
    template <class Call>
    static std::string Run(Call call, Interface& object) {
        if constexpr (std::is_void_v<decltype(call(object))>) {
            call(object);
            return {};
        } else {
            return ToText(call(object));
        }
    }
    template <class T>
    static std::string ToText(T const& result) {
        std::ostringstream text;
        if constexpr (std::is_same_v<T, Rect>)
            text << result.left << ' ' << result.top << ' ' << result.right << ' ' << result.bottom;
        else if constexpr (std::is_class_v<T>)
            text << "matrix of " << result[0];
        else
            text << result;
        return text.str();
    }

    std::function<std::string(Interface&)> mCall;
};

template <class Interface>
using Operations = std::vector<Operation<Interface>>;

inline Point const kPixel(1, 2);
inline PointF const kFrom(1, 2), kTo(3, 4);
inline Rect const kArea(1, 2, 3, 4);
inline RectF const kSrc(1, 2, 3, 4), kDst(5, 6, 7, 8);
inline Matrix3<float> const kMatrix;
inline std::vector<PointF> gPoints;
inline std::vector<RectF> const kDsts;
inline int gData, gUserData;
inline MKPaint const* const kPaint = Address<MKPaint>();
inline IMKBitmap* const kBitmap = Address<IMKBitmap>();
inline IMKCustomDrawable* const kDrawable = Address<IMKCustomDrawable>();

template <class Interface>
Operations<Interface> OfEveryKind() {
    return {
        [](auto& o) { return o.SetTag("tag"); },
        [](auto& o) { return o.GetMsgQueue(); },
        [](auto& o) { return o.Ref(); },
        [](auto& o) { return o.Unref(); },
    };
}

template <class Interface>
Operations<Interface> OfEveryCanvas() {
    return {
        [](auto& o) { return o.Clear(1); },
        [](auto& o) { return o.Clear(1, 2, 3, 4); },
        [](auto& o) { return o.ClearAll(1); },
        [](auto& o) { return o.ClearAll(1, 2, 3, 4); },
        [](auto& o) { return o.Save(IMKCanvasBase::SaveClip); },
        [](auto& o) { return o.Restore(1); },
        [](auto& o) { return o.SetClipRect(1, 2, 3, 4, IMKCanvasBase::Difference); },
        [](auto& o) { return o.SetMatrix(kMatrix); },
        [](auto& o) { return o.PreConcat(kMatrix); },
        [](auto& o) { return o.PostConcat(kMatrix); },
        [](auto& o) { return o.PreScale(1, 2); },
        [](auto& o) { return o.PostScale(1, 2); },
        [](auto& o) { return o.PreRotate(1); },
        [](auto& o) { return o.PreRotate(1, 2, 3); },
        [](auto& o) { return o.PostRotate(1); },
        [](auto& o) { return o.PostRotate(1, 2, 3); },
        [](auto& o) { return o.PreTranslate(1, 2); },
        [](auto& o) { return o.PostTranslate(1, 2); },
    };
}

// Those of one interface only.
template <class Interface>
Operations<Interface> OfOne();

template <>
inline Operations<IMKBitmap> OfOne() {
    return {
        [](auto& o) { return o.GetPixel(kPixel); },
        [](auto& o) { return o.GetPixelAsync(kPixel, &gUserData, [](unsigned int, void*) {}); },
        [](auto& o) { return o.GetBitmapData(kArea, &gData); },
        [](auto& o) {
            return o.GetBitmapDataAsync(kArea, &gData, &gUserData, [](Rect const&, void*, void*) {});
        },
        [](auto& o) { return o.GetX(); },
        [](auto& o) { return o.GetY(); },
        [](auto& o) { return o.GetWidth(); },
        [](auto& o) { return o.GetHeight(); },
        [](auto& o) { return o.GetBitmapRect(); },
        [](auto& o) { return o.GetTag(); },
        [](auto& o) { return o.Clone(); },
        [](auto& o) { return o.GetBitmapReadable(); },
        [](auto& o) { return o.GetBitmapWritable(); },
        [](auto& o) { return o.GetBitmapCanvasAttachable(); },
        [](auto& o) { return o.GetTextureBitmap(); },
    };
}

template <>
inline Operations<IMKCanvas> OfOne() {
    return {
        [](auto& o) { return o.Draw(kDrawable, kPaint); },
        [](auto& o) { return o.DrawLine(1, 2, 3, 4, kPaint); },
        [](auto& o) { return o.DrawLine(kFrom, kTo, kPaint); },
        [](auto& o) { return o.DrawSimpleLine(1, 2, 3, 4, kPaint); },
        [](auto& o) { return o.DrawSimpleLine(kFrom, kTo, kPaint); },
        [](auto& o) { return o.DrawSimpleLines(gPoints, kPaint); },
        [](auto& o) { return o.DrawRect(1, 2, 3, 4, kPaint); },
        [](auto& o) { return o.DrawRect(kSrc, kPaint); },
        [](auto& o) { return o.DrawRoundRect(1, 2, 3, 4, 5, 6, kPaint); },
        [](auto& o) { return o.DrawRoundRect(kSrc, 1, 2, kPaint); },
        [](auto& o) { return o.DrawCircle(1, 2, 3, kPaint); },
        [](auto& o) { return o.DrawBitmap(kBitmap, 1, 2, kPaint); },
        [](auto& o) { return o.DrawBitmap(kBitmap, kDst, kPaint); },
        [](auto& o) { return o.DrawBitmap(kBitmap, kSrc, kDst, kPaint); },
        [](auto& o) { return o.DrawBitmaps(kBitmap, gPoints, kPaint); },
        [](auto& o) { return o.DrawBitmaps(kBitmap, kDsts, kPaint); },
        [](auto& o) { return o.DrawBitmaps(kBitmap, kSrc, kDsts, kPaint); },
    };
}

template <>
inline Operations<IMKPenCanvas> OfOne() {
    return {
        [](auto& o) { return o.GetBitmap(); },       [](auto& o) { return o.GetModelMatrix(); },
        [](auto& o) { return o.GetCanvasMatrix(); }, [](auto& o) { return o.EnableClipRT(1); },
        [](auto& o) { return o.DisableClipRT(); },
    };
}

// Ref comes before Unref: called in order, they leave the count as it was.
template <class Interface>
Operations<Interface> GetOperations() {
    Operations<Interface> all = OfEveryKind<Interface>();
    auto const append = [&](Operations<Interface> const& more) {
        all.insert(all.end(), more.begin(), more.end());
    };
    if constexpr (std::is_base_of_v<IMKCanvasBase, Interface>) append(OfEveryCanvas<Interface>());
    append(OfOne<Interface>());
    return all;
}

} // namespace Moka::Testing

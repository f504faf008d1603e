// FrontEndText: the log texts of the two front ends, and their differences.
#pragma once

#include "moka/graphics/loader/Request.h"

namespace Moka {

class Bitmap;
class IMKBitmap;

namespace detail {

// For each kind of bitmap: its type in a request, and the class name of its front end, which is also the log
// tag.
template <class BitmapT>
struct FrontEndKind;

template <>
struct FrontEndKind<IMKBitmap> {
    static constexpr BitmapType kType = BITMAP_TYPE_GRAPHICS;
    static constexpr char const* kClass = "MKBitmapLoader";
};

template <>
struct FrontEndKind<Bitmap> {
    static constexpr BitmapType kType = BITMAP_TYPE_CPU;
    static constexpr char const* kClass = "BitmapLoader";
};

// The formats of the log lines. Each begins with the class, the front end's address and its name. Those whose
// constants end in Path contain the path and are used in engineering builds.
namespace FrontEndText {
constexpr char const* kDestructor = "%s[%p:%s] ~%s";
constexpr char const* kRequestLoad = "%s[%p:%s] RequestLoad(%d) ret %s";
constexpr char const* kRequestLoadPath = "%s[%p:%s] RequestLoad(%d, %s) ret %s";
constexpr char const* kCancelLoad = "%s[%p:%s] CancelLoadRequest(%d)";
constexpr char const* kCancelAllLoad = "%s[%p:%s] CancelAllLoadRequest()";
constexpr char const* kRequestSave = "%s[%p:%s] RequestSave(%p) ret %s";
constexpr char const* kRequestSavePath = "%s[%p:%s] RequestSave(%s, %p) ret %s";
constexpr char const* kOnLoad = "%s[%p:%s] OnLoad(%d, %p)";
constexpr char const* kOnLoadPath = "%s[%p:%s] OnLoad(%d, %s, %p)";
constexpr char const* kOnLoadList = "%s[%p:%s] OnLoadList(%d, %p, size%d)";
constexpr char const* kOnLoadListPath = "%s[%p:%s] OnLoadList(%d, %s, %p, size%d)";
constexpr char const* kOnLoadError = "%s[%p:%s] OnLoadError(%d)";
constexpr char const* kOnLoadErrorPath = "%s[%p:%s] OnLoadError(%d, %s)";
constexpr char const* kOnSave = "%s[%p:%s] OnSave";
constexpr char const* kOnSavePath = "%s[%p:%s] OnSave(%s)";
constexpr char const* kOnSaveError = "%s[%p:%s] OnSaveError";
constexpr char const* kOnSaveErrorPath = "%s[%p:%s] OnSaveError(%s)";
} // namespace FrontEndText

} // namespace detail
} // namespace Moka

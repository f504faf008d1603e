// FrontEndText: in what the two front ends differ: the kind of bitmap they ask for and the texts they log.
// Each text begins with the front end's address and name; those that end in Path show the path, in
// engineering builds.
#pragma once

#include "moka/graphics/loader/Request.h"

namespace Moka {

class Bitmap;
class IMKBitmap;

namespace detail {

template <class BitmapT>
struct FrontEndText;

template <>
struct FrontEndText<IMKBitmap> {
    static constexpr BitmapType kType = BITMAP_TYPE_GRAPHICS;
    static constexpr char const* kTag = "MKBitmapLoader";
    static constexpr char const* kDestructor = "MKBitmapLoader[%p:%s] ~MKBitmapLoader";
    static constexpr char const* kRequestLoad = "MKBitmapLoader[%p:%s] RequestLoad(%d) ret %s";
    static constexpr char const* kRequestLoadPath = "MKBitmapLoader[%p:%s] RequestLoad(%d, %s) ret %s";
    static constexpr char const* kCancelLoad = "MKBitmapLoader[%p:%s] CancelLoadRequest(%d)";
    static constexpr char const* kCancelAllLoad = "MKBitmapLoader[%p:%s] CancelAllLoadRequest()";
    static constexpr char const* kRequestSave = "MKBitmapLoader[%p:%s] RequestSave(%p) ret %s";
    static constexpr char const* kRequestSavePath = "MKBitmapLoader[%p:%s] RequestSave(%s, %p) ret %s";
    static constexpr char const* kOnLoad = "MKBitmapLoader[%p:%s] OnLoad(%d, %p)";
    static constexpr char const* kOnLoadPath = "MKBitmapLoader[%p:%s] OnLoad(%d, %s, %p)";
    static constexpr char const* kOnLoadList = "MKBitmapLoader[%p:%s] OnLoadList(%d, %p, size%d)";
    static constexpr char const* kOnLoadListPath = "MKBitmapLoader[%p:%s] OnLoadList(%d, %s, %p, size%d)";
    static constexpr char const* kOnLoadError = "MKBitmapLoader[%p:%s] OnLoadError(%d)";
    static constexpr char const* kOnLoadErrorPath = "MKBitmapLoader[%p:%s] OnLoadError(%d, %s)";
    static constexpr char const* kOnSave = "MKBitmapLoader[%p:%s] OnSave";
    static constexpr char const* kOnSavePath = "MKBitmapLoader[%p:%s] OnSave(%s)";
    static constexpr char const* kOnSaveError = "MKBitmapLoader[%p:%s] OnSaveError";
    static constexpr char const* kOnSaveErrorPath = "MKBitmapLoader[%p:%s] OnSaveError(%s)";
};

template <>
struct FrontEndText<Bitmap> {
    static constexpr BitmapType kType = BITMAP_TYPE_CPU;
    static constexpr char const* kTag = "BitmapLoader";
    static constexpr char const* kDestructor = "BitmapLoader[%p:%s] ~BitmapLoader";
    static constexpr char const* kRequestLoad = "BitmapLoader[%p:%s] RequestLoad(%d) ret %s";
    static constexpr char const* kRequestLoadPath = "BitmapLoader[%p:%s] RequestLoad(%d, %s) ret %s";
    static constexpr char const* kCancelLoad = "BitmapLoader[%p:%s] CancelLoadRequest(%d)";
    static constexpr char const* kCancelAllLoad = "BitmapLoader[%p:%s] CancelAllLoadRequest()";
    static constexpr char const* kRequestSave = "BitmapLoader[%p:%s] RequestSave(%p) ret %s";
    static constexpr char const* kRequestSavePath = "BitmapLoader[%p:%s] RequestSave(%s, %p) ret %s";
    static constexpr char const* kOnLoad = "BitmapLoader[%p:%s] OnLoad(%d, %p)";
    static constexpr char const* kOnLoadPath = "BitmapLoader[%p:%s] OnLoad(%d, %s, %p)";
    static constexpr char const* kOnLoadList = "BitmapLoader[%p:%s] OnLoadList(%d, %p, size%d)";
    static constexpr char const* kOnLoadListPath = "BitmapLoader[%p:%s] OnLoadList(%d, %s, %p, size%d)";
    static constexpr char const* kOnLoadError = "BitmapLoader[%p:%s] OnLoadError(%d)";
    static constexpr char const* kOnLoadErrorPath = "BitmapLoader[%p:%s] OnLoadError(%d, %s)";
    static constexpr char const* kOnSave = "BitmapLoader[%p:%s] OnSave";
    static constexpr char const* kOnSavePath = "BitmapLoader[%p:%s] OnSave(%s)";
    static constexpr char const* kOnSaveError = "BitmapLoader[%p:%s] OnSaveError";
    static constexpr char const* kOnSaveErrorPath = "BitmapLoader[%p:%s] OnSaveError(%s)";
};

} // namespace detail
} // namespace Moka

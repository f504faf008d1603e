/// BitmapLoaderInterface: receives the results of loads and saves.
/// Owner:  the implementer. The loader keeps a raw pointer until the request is completed.
/// Thread: the loader's thread calls all functions. OnCallbackPending comes first, with the loader's lock
///         held: it must not wait for another thread that uses the loader. Then come one result and
///         OnCallbackCompleted, without a lock. After OnCallbackCompleted the loader does not use the
///         listener.
/// Fails:  exceptions of a function are logged as errors; the remaining functions are still called.
#pragma once

#include "moka/base/Export.h"

#include <vector>

namespace Moka {

class Bitmap;
class IMKBitmap;
class String;

class MOKA_API BitmapLoaderInterface {
public:
    /// Loading succeeded. A CPU bitmap stays valid until the render thread has run the tasks that are posted
    /// to the request's queue during this call. A GPU bitmap stays valid until the call returns; take a
    /// reference to keep it.
    virtual void OnLoad(int id, String const& path, Bitmap& bitmap);
    virtual void OnLoad(int id, String const& path, IMKBitmap& bitmap);

    /// For listeners that pass on lists. The loader never calls these.
    virtual void OnLoadList(int id, String const& path, std::vector<Bitmap*>& bitmaps);
    virtual void OnLoadList(int id, String const& path, std::vector<IMKBitmap*>& bitmaps);

    /// Loading failed, saving succeeded, saving failed. The loader calls one of OnLoad and these for each
    /// request.
    virtual void OnLoadError(int id, String const& path) = 0;
    virtual void OnSave(int id, String const& path, void* userData) = 0;
    virtual void OnSaveError(int id, String const& path, void* userData) = 0;

    /// Before and after the result; see above.
    virtual void OnCallbackPending() = 0;
    virtual void OnCallbackCompleted() = 0;

    virtual ~BitmapLoaderInterface();
};

} // namespace Moka

/// BitmapLoaderInterface: receives the results of loads and saves.
/// Owner:  the implementer; the loader keeps a plain pointer until the request is over.
/// Thread: everything is called on the loader's thread. OnCallbackPending comes first, inside the loader's
///         lock: it must not wait for anything that another thread does with the loader. Then one result,
///         then OnCallbackCompleted, both with no lock held. After OnCallbackCompleted nothing touches the
///         listener.
/// Fails:  an exception of an operation is logged as an error; the rest of the sequence is still called.
#pragma once

#include "moka/base/Export.h"

#include <vector>

namespace Moka {

class Bitmap;
class IMKBitmap;
class String;

class MOKA_API BitmapLoaderInterface {
public:
    /// A CPU bitmap stays valid until the render thread has run what is posted to the request's queue now; a
    /// GPU bitmap until the call returns, unless the listener takes a reference of its own.
    virtual void OnLoad(int id, String const& path, Bitmap& bitmap);
    virtual void OnLoad(int id, String const& path, IMKBitmap& bitmap);

    /// For listeners that deliver lists; the loader itself never calls them.
    virtual void OnLoadList(int id, String const& path, std::vector<Bitmap*>& bitmaps);
    virtual void OnLoadList(int id, String const& path, std::vector<IMKBitmap*>& bitmaps);

    /// One call for each request: loading failed, saving succeeded, or saving failed.
    virtual void OnLoadError(int id, String const& path) = 0;
    virtual void OnSave(int id, String const& path, void* userData) = 0;
    virtual void OnSaveError(int id, String const& path, void* userData) = 0;

    /// Before and after the result; see above.
    virtual void OnCallbackPending() = 0;
    virtual void OnCallbackCompleted() = 0;

    virtual ~BitmapLoaderInterface();
};

} // namespace Moka

/// MKBitmapLoader: loads image files into GPU bitmaps, and saves GPU bitmaps and pixels to image files, in
/// the background. See LoaderFrontEnd.h for requests, callbacks and threads. A loaded bitmap is created on
/// the queue of its request, which must not be null. The loader releases it after onLoad; take a reference to
/// keep it. The destructor drops this loader's loads; its saves still write their files but call nobody. It
/// waits for a running callback of this loader, not for a decode.
#pragma once

#include "moka/base/Export.h"
#include "moka/graphics/loader/LoaderFrontEnd.h"

namespace Moka {

extern template class MOKA_API detail::LoaderFrontEnd<IMKBitmap>;

class MOKA_API MKBitmapLoader : public detail::LoaderFrontEnd<IMKBitmap> {
public:
    /// name appears in log lines. It is not copied and may be null. callback is copied and may be null.
    MKBitmapLoader(char const* name, Callback* callback);
    ~MKBitmapLoader() override;

    /// Posts a read-back of the pixels; then the loader writes the file. Returns false if the bitmap is empty
    /// or memory runs out. If the bitmap's queue refuses the read-back, the request stays pending for ever:
    /// the file is not written, nobody is called, and waiting for all saves does not end.
    bool RequestSave(int id, String const& path, IMKBitmap& bitmap, void* userData, int quality);
    using LoaderFrontEnd::RequestSave;
};

} // namespace Moka

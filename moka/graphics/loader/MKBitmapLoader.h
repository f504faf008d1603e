/// MKBitmapLoader: loads image files into GPU bitmaps, and saves GPU bitmaps and pixels into image files,
/// without making the caller wait. See LoaderFrontEnd.h for requests, callbacks and threads. A loaded bitmap
/// is made on the queue of its request, which must not be null then; the loader releases it after onLoad:
/// to keep it, take a reference. Destruction drops this loader's loads; its saves still write their
/// files but call nobody. It waits for a function of this loader that is running, not for a decode.
#pragma once

#include "moka/base/Export.h"
#include "moka/graphics/loader/LoaderFrontEnd.h"

namespace Moka {

extern template class MOKA_API detail::LoaderFrontEnd<IMKBitmap>;

class MOKA_API MKBitmapLoader : public detail::LoaderFrontEnd<IMKBitmap> {
public:
    /// name appears in log lines, is not copied and may be null. callback is copied and may be null.
    MKBitmapLoader(char const* name, Callback* callback);
    ~MKBitmapLoader() override;

    /// Reads the pixels back as the render thread comes to it, then writes the file. False for an empty
    /// bitmap and when memory runs out. A read-back that the bitmap's queue refuses stays pending for ever:
    /// the file is not written, nobody is called, and waiting for all saves does not end.
    bool RequestSave(int id, String const& path, IMKBitmap& bitmap, void* userData, int quality);
    using LoaderFrontEnd::RequestSave;
};

} // namespace Moka

/// BitmapLoader: loads image files into CPU bitmaps, and saves CPU bitmaps and pixels into image files,
/// without making the caller wait. See LoaderFrontEnd.h for requests, callbacks and threads. A loaded bitmap
/// is deleted by a task posted to the queue of its request right after the callbacks; a queue that is null or
/// refuses leaves it alive, and it belongs to whoever got it in onLoad. Destruction drops this loader's loads;
/// its saves still write their files but call nobody. It waits for a function of this loader that is running,
/// not for a decode.
#pragma once

#include "moka/base/Export.h"
#include "moka/graphics/loader/LoaderFrontEnd.h"

namespace Moka {

extern template class MOKA_API detail::LoaderFrontEnd<Bitmap>;

class MOKA_API BitmapLoader : public detail::LoaderFrontEnd<Bitmap> {
public:
    /// name appears in log lines, is not copied and may be null. callback is copied and may be null.
    BitmapLoader(char const* name, Callback* callback);
    ~BitmapLoader() override;

    /// Saves the bitmap's own pixels, rows packed. The loader frees them with array delete afterwards, so the
    /// bitmap must not: SetDeleteBuffer(false). False, with the pixels still the bitmap's, when it has none or
    /// memory runs out.
    // Compat: saved-pixels
    bool RequestSave(int id, String const& path, Bitmap& bitmap, void* userData, int quality);
    using LoaderFrontEnd::RequestSave;
};

} // namespace Moka

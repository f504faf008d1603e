/// BitmapLoader: loads image files into CPU bitmaps, and saves CPU bitmaps and pixels to image files, in the
/// background. See LoaderFrontEnd.h for requests, callbacks and threads. After the callbacks, a task posted
/// to the queue of the request deletes the loaded bitmap. If the queue is null or refuses the task, the
/// receiver of onLoad must delete the bitmap. The destructor drops this loader's loads; its saves still write
/// their files but call nobody. It waits for a running callback of this loader, not for a decode.
#pragma once

#include "moka/base/Export.h"
#include "moka/graphics/loader/LoaderFrontEnd.h"

namespace Moka {

extern template class MOKA_API detail::LoaderFrontEnd<Bitmap>;

class MOKA_API BitmapLoader : public detail::LoaderFrontEnd<Bitmap> {
public:
    /// name appears in log lines. It is not copied and may be null. callback is copied and may be null.
    BitmapLoader(char const* name, Callback* callback);
    ~BitmapLoader() override;

    /// Saves the bitmap's pixels without copying them; rows must be packed. The loader deletes the pixels
    /// afterwards, so the bitmap must not own them: call SetDeleteBuffer(false). Returns false, and does not
    /// delete the pixels, if there are none or memory runs out.
    // Compat: saved-pixels
    bool RequestSave(int id, String const& path, Bitmap& bitmap, void* userData, int quality);
    using LoaderFrontEnd::RequestSave;
};

} // namespace Moka

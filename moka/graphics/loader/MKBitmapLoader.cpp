#include "moka/graphics/loader/MKBitmapLoader.h"

#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/loader/BitmapLoaderImpl.h"

namespace Moka {

MKBitmapLoader::MKBitmapLoader(char const* name, Callback* callback) : LoaderFrontEnd(name, callback) {}

MKBitmapLoader::~MKBitmapLoader() { Detach(); }

bool MKBitmapLoader::RequestSave(int id, String const& path, IMKBitmap& bitmap, void* userData, int quality) {
    auto& loader = detail::BitmapLoaderImpl::GetInstance();
    return LogSave(path, &bitmap, loader.RequestSave(this, id, path, bitmap, userData, quality));
}

} // namespace Moka

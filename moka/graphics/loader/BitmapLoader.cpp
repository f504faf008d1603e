#include "moka/graphics/loader/BitmapLoader.h"

#include "moka/base/Bitmap.h"
#include "moka/base/Check.h"
#include "moka/graphics/loader/BitmapLoaderImpl.h"

namespace Moka {

BitmapLoader::BitmapLoader(char const* name, Callback* callback) : LoaderFrontEnd(name, callback) {}

BitmapLoader::~BitmapLoader() { Detach(); }

bool BitmapLoader::RequestSave(int id, String const& path, Bitmap& bitmap, void* userData, int quality) {
    MOKA_CHECK(bitmap.GetStride() == bitmap.GetWidth() * 4, "the rows of a bitmap to save are packed");
    auto& loader = detail::BitmapLoaderImpl::GetInstance();
    return LogSave(path, &bitmap,
                   loader.RequestSave(this, id, path, bitmap.GetBuffer(), bitmap.GetWidth(),
                                      bitmap.GetHeight(), userData, quality));
}

} // namespace Moka
